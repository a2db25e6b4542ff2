#include "program/command/commands.h"
#include "program/command/commandsession.h"
#include "program/commandline.h"
#include "program/terminal/linereader.h"
#include "program/terminal/output.h"
#include "program/terminal/promptreader.h"

#include <fmt/format.h>

#include <cstdio>
#include <optional>
#include <unistd.h>

namespace velmora::cli {

namespace {

constexpr unsigned int consoleLimitMs = 5000;

void answer(Session& session, std::string const& command)
{
    std::string reply;
    obd::IDevice::Status const status = session.proxy()->execute(command, reply, consoleLimitMs);
    session.check();
    if (status == obd::IDevice::Status::Ok) {
        fmt::print("{}\n", reply);
    } else {
        // The driver takes the adapter's error words and "?" off every reply.
        fmt::print("(no data)\n");
    }
    flushOutput();
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
        return m_lines.read(command);
    }

private:
    LineReader m_lines;
    bool m_asking;
    std::optional<PromptReader> m_prompt;
};

ExitCode console(GlobalOptions const& options)
{
    CommandSession session(options);
    session.connect();
    CommandSource commands(session);
    std::string command;
    while (commands.read(command) && command != "exit" && command != "quit") {
        if (!command.empty()) {
            answer(session, command);
        }
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
