#include "program/command/confirm.h"

#include "program/terminal/interrupt.h"
#include "program/terminal/linereader.h"
#include "program/view/printtext.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <functional>
#include <unistd.h>

namespace velmora::cli {

namespace {

bool isYes(std::string const& answer)
{
    return answer == "y" || answer == "Y" || answer == "yes";
}

// check throws what ends the waiting.
bool asked(std::string const& warning, std::string const& question, std::function<void()> const& check)
{
    dropTypedAhead();
    tellText(fmt::format("{}{} [y/N] ", warning, question));
    std::string answer;
    return LineReader(check).read(answer) && isYes(answer);
}

void requireNoInterrupt()
{
    if (Interrupt::instance().raised()) {
        throw Error(ErrorKind::Interrupted, "Interrupted");
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
    return car.options().yes || asked(warning, question, [&car] { car.check(); });
}

bool confirmed(GlobalOptions const& options, std::string const& warning, std::string const& question)
{
    return options.yes || asked(warning, question, requireNoInterrupt);
}

} // namespace velmora::cli
