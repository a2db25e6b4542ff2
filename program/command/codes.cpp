#include "program/command/codesuds.h"
#include "program/command/commands.h"
#include "program/command/makeoption.h"
#include "program/command/modulecommand.h"
#include "program/commandline.h"

#include <algorithm>

namespace velmora::cli {

namespace {

struct CodesOptions
{
    bool confirmed = false;
    bool pending = false;
    bool permanent = false;
    bool uds = false;
    std::string maker;
};

std::vector<CodeKind> chosenKinds(CodesOptions const& options)
{
    bool const all = !options.confirmed && !options.pending && !options.permanent;
    std::vector<CodeKind> kinds;
    for (auto const& [kind, chosen] : {std::pair(CodeKind::Confirmed, options.confirmed),
                                       {CodeKind::Pending, options.pending},
                                       {CodeKind::Permanent, options.permanent}}) {
        if (chosen || all) {
            kinds.push_back(kind);
        }
    }
    return kinds;
}

bool anyList(std::vector<ModuleTopic<CodeReport>> const& modules, CodeList::Answer answer)
{
    return std::any_of(modules.begin(), modules.end(), [answer](ModuleTopic<CodeReport> const& module) {
        return std::any_of(module.report.lists.begin(), module.report.lists.end(),
                           [answer](CodeList const& list) { return list.answer == answer; });
    });
}

Error withoutAnswer(Car& car, std::vector<ModuleTopic<CodeReport>> const& modules)
{
    if (anyList(modules, CodeList::Answer::Refused)) {
        return {ErrorKind::Refused,
                "The vehicle refused to report these codes",
                {"try again with the ignition on and the engine off"}};
    }
    std::vector<std::string> const hints = {
        "is the ignition on?", "not all vehicles report pending codes, and only newer ones permanent codes"};
    if (!car.trouble().empty()) {
        return silentVehicle(car, "No control module reported these codes", hints);
    }
    return {ErrorKind::NotSupported, "No control module reported these codes", hints};
}

ExitCode codes(CodesOptions const& chosen, GlobalOptions const& options)
{
    if (chosen.uds) {
        return udsCodes(chosen.maker, options);
    }
    CommandCar car(options);
    auto const modules = car.codeReports(chosenKinds(chosen), chosen.maker);
    print(modules, options);
    requireAnswer(car, modules, withoutAnswer(car, modules));
    return ExitCode::Done;
}

} // namespace

void addCodesCommand(CommandLine& commandLine)
{
    auto const chosen = std::make_shared<CodesOptions>();
    CLI::App* const command =
        commandLine.addCommand("codes", "Show trouble codes; all kinds, if none is chosen",
                               [chosen](GlobalOptions const& options) { return codes(*chosen, options); });
    command->add_flag("--confirmed", chosen->confirmed, "The stored codes");
    command->add_flag("--pending", chosen->pending, "Codes of this or the last driving cycle");
    command->add_flag("--permanent", chosen->permanent, "Codes that only the vehicle itself erases");
    command
        ->add_flag("--uds", chosen->uds,
                   "By service 19 of ISO 14229, with failure types and states, or service 18 of\n"
                   "ISO 14230; also of the modules that `modules` has found")
        ->excludes("--confirmed")
        ->excludes("--pending")
        ->excludes("--permanent");
    addMakeOption(*command, chosen->maker);
}

} // namespace velmora::cli
