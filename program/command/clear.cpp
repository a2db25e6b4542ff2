#include "program/command/commandcar.h"
#include "program/command/commands.h"
#include "program/command/confirm.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"

#include <velmora/error.h>
#include <velmora/print.h>

#include <fmt/format.h>

#include <sstream>

namespace velmora::cli {

namespace {

constexpr char const* clearWarning =
    R"(This clears the confirmed and pending trouble codes of all control modules and turns the lamp off.
It also erases: freeze frames, readiness (the vehicle must be driven before it can pass an emissions
test), monitor test results, and the distance and time since codes were cleared.
Permanent codes stay. Note codes and freeze frame down first if they may be needed.
)";

// Clearing is functional: the request reaches every module, whichever one is selected.
void checkOptions(GlobalOptions const& options)
{
    if (options.module) {
        throw Error(ErrorKind::WrongUse, "Clearing reaches all control modules; it can't be held to one",
                    {"leave --ecu out to clear the codes of all"});
    }
    requireConsent(options, "Clearing", "clears without asking");
}

std::string outcomeText(ModuleTopic<ClearReport> const& module)
{
    std::ostringstream outcome;
    outcome << module.report;
    return fmt::format("Control module {:X}{}{}: {}\n", module.id, module.name.empty() ? "" : " ", module.name,
                       outcome.str());
}

ExitCode clear(GlobalOptions const& options)
{
    checkOptions(options);
    CommandCar car(options);
    if (!confirmed(car, clearWarning, "Clear now?")) {
        tell("Nothing was cleared.\n");
        return ExitCode::Failed;
    }
    auto const modules = car.tryClearCodes();
    if (options.json) {
        fmt::print("{}", toJson(modules));
    } else {
        for (ModuleTopic<ClearReport> const& module : modules) {
            printText(outcomeText(module));
        }
    }
    flushOutput();
    requireAllCleared(modules);
    return ExitCode::Done;
}

} // namespace

void addClearCommand(CommandLine& commandLine)
{
    commandLine.addCommand("clear",
                           "Clear trouble codes, and with them freeze frames and readiness, in all control modules; "
                           "asks first",
                           clear);
}

} // namespace velmora::cli
