#include "velmora/command/commands.h"
#include "velmora/commandline.h"
#include "velmora/failure.h"
#include "velmora/session.h"

#include <cstdio>
#include <fmt/format.h>
#include <iostream>
#include <poll.h>
#include <unistd.h>

namespace velmora {

namespace {

constexpr unsigned int replyLimitMs = 5000;

// Lines of standard input, without losing Ctrl-C while waiting for one.
class LineReader
{
public:
    explicit LineReader(Session const& session) : m_session(session) {}

    // False at the end of the input.
    bool read(std::string& line)
    {
        while (true) {
            std::size_t const end = m_buffer.find('\n');
            if (end != std::string::npos) {
                line = m_buffer.substr(0, end);
                m_buffer.erase(0, end + 1);
                return true;
            }
            if (!fill()) {
                line = std::exchange(m_buffer, {});
                return !line.empty();
            }
        }
    }

private:
    bool fill()
    {
        pollfd input{STDIN_FILENO, POLLIN, 0};
        while (::poll(&input, 1, 100) <= 0) {
            m_session.check();
        }
        char bytes[512];
        ssize_t const count = ::read(STDIN_FILENO, bytes, sizeof bytes);
        if (count > 0) {
            m_buffer.append(bytes, static_cast<std::size_t>(count));
        }
        return count > 0;
    }

    Session const& m_session;
    std::string m_buffer;
};

void answer(Session& session, std::string const& command)
{
    std::string reply;
    obd::IDevice::Status const status = session.proxy()->execute(command, reply, replyLimitMs);
    session.check();
    if (status == obd::IDevice::Status::Ok) {
        fmt::print("{}\n", reply);
    } else {
        // The driver takes the adapter's error words and "?" off every reply.
        fmt::print("(no data)\n");
    }
    std::fflush(stdout);
}

ExitCode console(GlobalOptions const& options)
{
    Session session(options);
    session.connect();
    bool const prompting = ::isatty(STDIN_FILENO) != 0 && !options.quiet;
    LineReader lines(session);
    std::string command;
    while (true) {
        if (prompting) {
            fmt::print(stderr, "> ");
        }
        if (!lines.read(command)) {
            return ExitCode::Done;
        }
        if (command == "exit" || command == "quit") {
            return ExitCode::Done;
        }
        if (!command.empty()) {
            answer(session, command);
        }
    }
}

} // namespace

void addConsoleCommand(CommandLine& commandLine)
{
    commandLine.addCommand("console", "Talk to the adapter, line by line; reads commands from a pipe as well", console);
}

} // namespace velmora
