#include "program/command/confirm.h"

#include "program/terminal/interrupt.h"
#include "program/terminal/linereader.h"
#include "program/view/printtext.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <poll.h>
#include <unistd.h>

namespace velmora::cli {

namespace {

bool isYes(std::string const& answer)
{
    return answer == "y" || answer == "Y" || answer == "yes";
}

// A line of standard input, without its line feed. Throws Error on Ctrl-C.
std::string readAnswer()
{
    std::string line;
    while (true) {
        pollfd input{STDIN_FILENO, POLLIN, 0};
        bool const ready = ::poll(&input, 1, 100) > 0;
        if (Interrupt::instance().raised()) {
            throw Error(ErrorKind::Interrupted, "Interrupted");
        }
        char byte = 0;
        if (ready && (::read(STDIN_FILENO, &byte, 1) <= 0 || byte == '\n')) {
            return line;
        }
        if (ready) {
            line += byte;
        }
    }
}

} // namespace

void requireConsent(GlobalOptions const& options, std::string const& action, std::string const& yes)
{
    if (!options.yes && ::isatty(STDIN_FILENO) == 0) {
        throw Error(ErrorKind::WrongUse, action + " must be confirmed, and there is no terminal to ask",
                    {"--yes " + yes});
    }
}

bool confirmed(CommandCar& car, std::string const& warning, std::string const& question)
{
    if (car.options().yes) {
        return true;
    }
    dropTypedAhead();
    tellText(fmt::format("{}{} [y/N] ", warning, question));
    std::string answer;
    return LineReader([&car] { car.check(); }).read(answer) && isYes(answer);
}

bool confirmed(GlobalOptions const& options, std::string const& warning, std::string const& question)
{
    if (options.yes) {
        return true;
    }
    dropTypedAhead();
    tellText(fmt::format("{}{} [y/N] ", warning, question));
    return isYes(readAnswer());
}

} // namespace velmora::cli
