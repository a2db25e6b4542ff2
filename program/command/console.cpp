#include "common/text/text.h"
#include "program/command/commandcar.h"
#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/linereader.h"
#include "program/terminal/output.h"
#include "program/terminal/promptreader.h"
#include "program/view/json.h"

#include <velmora/console.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <cstdio>
#include <optional>
#include <unistd.h>

namespace velmora::cli {

namespace {

using Answer = AdapterConsole::Answer;

void print(std::string const& command, Answer const& answer, bool json)
{
    if (json) {
        Json const line = {{"command", command}, {"answered", answer.complete}, {"lines", answer.lines}};
        fmt::print("{}\n", line.dump(-1, ' ', false, Json::error_handler_t::replace));
    } else {
        for (std::string const& line : answer.lines) {
            fmt::print("{}\n", readable(line));
        }
    }
    flushOutput();
    if (!answer.complete) {
        tell("(no answer)\n");
    }
}

// Asks for each command if a user is there to be asked.
class CommandSource
{
public:
    CommandSource(AdapterConsole const& console, GlobalOptions const& options)
        : m_lines([&console] { console.check(); }), m_asking(::isatty(STDIN_FILENO) != 0 && !options.quiet)
    {
        if (m_asking && PromptReader::isUsable()) {
            m_prompt.emplace([&console] { console.check(); });
        }
    }

    // False at the end of the input.
    bool read(std::string& command)
    {
        if (m_prompt) {
            return m_prompt->read(command);
        }
        if (m_asking) {
            tell("> ");
        }
        bool const more = m_lines.read(command);
        if (command.ends_with('\r')) {
            command.pop_back(); // of a file with the line ends of another system
        }
        return more;
    }

private:
    LineReader m_lines;
    bool m_asking;
    std::optional<PromptReader> m_prompt;
};

ExitCode console(GlobalOptions const& options)
{
    InterruptStop const stop;
    AdapterConsole dialogue(carOptions(options, stop.token()));
    CommandSource commands(dialogue, options);
    std::string command;
    bool silent = false; // to the last command
    bool answered = false;
    while (commands.read(command) && command != "exit" && command != "quit") {
        if (!command.empty()) {
            Answer const answer = dialogue.ask(command);
            print(command, answer, options.json);
            silent = !answer.complete;
            answered = answered || answer.complete;
        }
    }
    if (silent && answered) {
        throw Error(ErrorKind::AdapterSilent, "The adapter on " + dialogue.port() + " no longer answers",
                    {"is it still in its socket, and in reach?", "pull the adapter and plug it in again"});
    }
    if (silent) {
        throw Error(ErrorKind::AdapterSilent, "Nothing on " + dialogue.port() + " answered any command",
                    {"is it the right port, and the right --baud?", "pull the adapter and plug it in again"});
    }
    return ExitCode::Done;
}

} // namespace

void addConsoleCommand(CommandLine& commandLine)
{
    commandLine.addCommand(
        "console",
        "Talk to the adapter, line by line, earlier lines with the arrow keys; reads commands from a pipe as well",
        console);
}

} // namespace velmora::cli
