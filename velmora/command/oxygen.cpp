#include "velmora/command/commands.h"
#include "velmora/command/modulecommand.h"
#include "velmora/commandline.h"
#include "velmora/diagnosticreaders.h"

namespace velmora {

void addOxygenCommand(CommandLine& commandLine)
{
    commandLine.addCommand("oxygen", "Show the oxygen sensors, and their tests on buses before CAN",
                           [](GlobalOptions const& options) {
                               return showTopic(options, readOxygen,
                                                {ExitCode::NotSupported,
                                                 "No control module reports oxygen sensors",
                                                 {"diesel engines have none, or don't report them"}});
                           });
}

} // namespace velmora
