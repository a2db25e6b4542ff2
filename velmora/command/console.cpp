#include "velmora/command/commands.h"
#include "velmora/commandline.h"
#include "velmora/linereader.h"
#include "velmora/session.h"

#include <cstdio>
#include <fmt/format.h>
#include <unistd.h>

namespace velmora {

namespace {

constexpr unsigned int replyLimitMs = 5000;

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
