#include "program/command/commands.h"
#include "program/command/makeoption.h"
#include "program/command/modulecommand.h"
#include "program/commandline.h"

namespace velmora::cli {

namespace {

struct FreezeOptions
{
    unsigned int frame = 0;
    std::string maker;
};

ExitCode freeze(FreezeOptions const& chosen, GlobalOptions const& options)
{
    CommandCar car(options);
    auto const modules = car.freezeFrame(static_cast<unsigned char>(chosen.frame), chosen.maker);
    print(modules, options);
    requireAnswer(car, modules,
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
