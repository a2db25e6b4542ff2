#include "libvelmora/read/freezereader.h"
#include "program/command/commands.h"
#include "program/command/modulecommand.h"
#include "program/commandline.h"

namespace velmora::cli {

namespace {

ExitCode freeze(unsigned int frame, GlobalOptions const& options)
{
    return showTopic(
        options,
        [frame](Session& session, obd::IEcu const& ecu) {
            return readFreeze(session, ecu, static_cast<unsigned char>(frame));
        },
        Error(ErrorKind::NotSupported, fmt::format("No control module answers for freeze frame {}", frame),
              {"vehicles with no code stored may not answer; most know frame 0 only"}));
}

} // namespace

void addFreezeCommand(CommandLine& commandLine)
{
    auto const frame = std::make_shared<unsigned int>(0);
    CLI::App* const command =
        commandLine.addCommand("freeze", "Show what the vehicle froze when a code was set",
                               [frame](GlobalOptions const& options) { return freeze(*frame, options); });
    command->add_option("FRAME", *frame, "Number of the frame, 0 to 255 (0)")
        ->type_name("N")
        ->check(CLI::Range(0, 255));
}

} // namespace velmora::cli
