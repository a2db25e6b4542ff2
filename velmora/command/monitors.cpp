#include "velmora/command/commands.h"
#include "velmora/command/modulecommand.h"
#include "velmora/commandline.h"
#include "velmora/diagnosticreaders.h"

namespace velmora {

void addMonitorsCommand(CommandLine& commandLine)
{
    commandLine.addCommand("monitors", "Show the results of the on-board monitors' tests",
                           [](GlobalOptions const& options) {
                               return showTopic(options, readMonitors,
                                                {ExitCode::NotSupported,
                                                 "No control module offers monitor test results",
                                                 {"older vehicles may have oxygen sensor tests only: velmora oxygen"}});
                           });
}

} // namespace velmora
