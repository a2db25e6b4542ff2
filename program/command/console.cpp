#include "common/text/text.h"
#include "program/command/commands.h"
#include "program/command/commandsession.h"
#include "program/commandline.h"
#include "program/terminal/linereader.h"
#include "program/terminal/output.h"
#include "program/terminal/promptreader.h"
#include "program/view/json.h"

#include <obd/idataconnection.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <chrono>
#include <cstdio>
#include <optional>
#include <unistd.h>

namespace velmora::cli {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::seconds adapterLimit{5};
constexpr std::chrono::seconds vehicleLimit{30}; // a search for the bus takes that long
constexpr int stepMs = 100;

// What the adapter sent up to its prompt, line by line, without the echo of the command.
struct Answer
{
    bool complete = false; // whether the prompt came
    std::vector<std::string> lines;
};

// The bare dialogue with whatever is at the port, without the library's: what it says is shown as it came.
class AdapterDialogue
{
public:
    explicit AdapterDialogue(CommandSession& session) : m_session(session), m_connection(session.connectToPort())
    {
        m_connection->setDelimiter('>');
    }

    // Throws Error if the link breaks or the user interrupts meanwhile.
    Answer ask(std::string const& command)
    {
        std::vector<unsigned char> message;
        while (m_connection->receive(message, 0)) {
            // what came unasked belongs to nothing
        }
        std::string const sent = command + "\r";
        m_connection->send({sent.begin(), sent.end()});
        bool const ofAdapter = toUpper(command).starts_with("AT") || toUpper(command).starts_with("ST");
        if (await(message, ofAdapter ? adapterLimit : vehicleLimit)) {
            return {true, linesOf(message, command)};
        }
        // An adapter that shows traffic without end stops at any character. A CR would repeat a command that was done.
        m_connection->send({' '});
        return await(message, adapterLimit) ? Answer{true, linesOf(message, command)} : Answer{};
    }

private:
    bool await(std::vector<unsigned char>& message, Clock::duration limit) const
    {
        Clock::time_point const end = Clock::now() + limit;
        while (Clock::now() < end) {
            m_session.check();
            if (m_connection->receive(message, stepMs)) {
                return true;
            }
        }
        return false;
    }

    static std::vector<std::string> linesOf(std::vector<unsigned char> const& message, std::string const& command)
    {
        std::vector<std::string> lines = adapterLines({message.begin(), message.end()});
        if (!lines.empty() && lines.front() == command) {
            lines.erase(lines.begin());
        }
        return lines;
    }

    CommandSession& m_session;
    std::shared_ptr<obd::IDataConnection> m_connection;
};

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
    explicit CommandSource(CommandSession const& session)
        : m_lines(session), m_asking(::isatty(STDIN_FILENO) != 0 && !session.options().quiet)
    {
        if (m_asking && PromptReader::isUsable()) {
            m_prompt.emplace(session);
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
    CommandSession session(options);
    AdapterDialogue dialogue(session);
    CommandSource commands(session);
    std::string command;
    bool asked = false;
    bool answered = false;
    while (commands.read(command) && command != "exit" && command != "quit") {
        if (!command.empty()) {
            Answer const answer = dialogue.ask(command);
            print(command, answer, options.json);
            asked = true;
            answered = answered || answer.complete;
        }
    }
    if (asked && !answered) {
        throw Error(ErrorKind::AdapterSilent, "Nothing on " + session.port() + " answered any command",
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
