#include "libvelmora/read/freezereader.h"
#include "libvelmora/read/makerreader.h"
#include "program/command/commands.h"
#include "program/command/makeoption.h"
#include "program/command/modulecommand.h"
#include "program/commandline.h"

#include <algorithm>

namespace velmora::cli {

namespace {

struct FreezeOptions
{
    unsigned int frame = 0;
    std::string maker;
};

// Whether the code of any frame means something else with each maker.
bool needsMaker(std::vector<ModuleTopic<FreezeReport>> const& modules)
{
    return std::any_of(modules.begin(), modules.end(), [](ModuleTopic<FreezeReport> const& module) {
        return module.report.frame && isMakersCode(module.report.frame->code.code);
    });
}

ExitCode freeze(FreezeOptions const& chosen, GlobalOptions const& options)
{
    CommandSession session(options);
    session.connect();
    auto modules = readModules(session, [&chosen](Session& each, obd::IEcu const& ecu) {
        return readFreeze(each, ecu, static_cast<unsigned char>(chosen.frame));
    });
    if (needsMaker(modules)) {
        MakerChoice const maker = readMaker(session, chosen.maker);
        for (ModuleTopic<FreezeReport>& module : modules) {
            applyMaker(module.report, maker);
        }
    }
    print(modules, options);
    requireAnswer(session, modules,
                  Error(ErrorKind::NotSupported,
                        fmt::format("No control module answers for freeze frame {}", chosen.frame),
                        {"vehicles with no code stored may not answer; most know frame 0 only"}));
    return ExitCode::Done;
}

} // namespace

void addFreezeCommand(CommandLine& commandLine)
{
    auto const chosen = std::make_shared<FreezeOptions>();
    CLI::App* const command =
        commandLine.addCommand("freeze", "Show what the vehicle froze when a code was set",
                               [chosen](GlobalOptions const& options) { return freeze(*chosen, options); });
    command->add_option("FRAME", chosen->frame, "Number of the frame, 0 to 255 (0)")
        ->type_name("N")
        ->check(CLI::Range(0, 255));
    addMakeOption(*command, chosen->maker);
}

} // namespace velmora::cli
