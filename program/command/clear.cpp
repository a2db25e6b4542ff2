#include "libvelmora/read/codeclearing.h"
#include "libvelmora/report/clearreport.h"
#include "program/command/commands.h"
#include "program/command/commandsession.h"
#include "program/command/confirm.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"

#include <velmora/error.h>

#include <fmt/format.h>

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
    if (options.ecu) {
        throw Error(ErrorKind::WrongUse, "Clearing reaches all control modules; it can't be held to one",
                    {"leave --ecu out to clear the codes of all"});
    }
    requireConsent(options, "Clearing", "clears without asking");
}

std::string outcomeText(ModuleTopic<ClearReport> const& module)
{
    return fmt::format("Control module {:X}{}{}: {}{}{}\n", module.id, module.name.empty() ? "" : " ", module.name,
                       resultWord(module.report.result), module.report.reason.empty() ? "" : ": ",
                       module.report.reason);
}

ExitCode judge(std::vector<ModuleTopic<ClearReport>> const& modules)
{
    for (ModuleTopic<ClearReport> const& module : modules) {
        if (module.report.result == ClearReport::Result::Refused) {
            throw refusedToClear(module);
        }
    }
    requireCleared(modules);
    return ExitCode::Done;
}

ExitCode clear(GlobalOptions const& options)
{
    checkOptions(options);
    CommandSession session(options);
    session.connect();
    if (!confirmed(session, clearWarning, "Clear now?")) {
        tell("Nothing was cleared.\n");
        return ExitCode::Failed;
    }
    auto const modules = clearCodes(session);
    if (options.json) {
        fmt::print("{}", toJson(modules));
    } else {
        for (ModuleTopic<ClearReport> const& module : modules) {
            printText(outcomeText(module));
        }
    }
    flushOutput();
    return judge(modules);
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
