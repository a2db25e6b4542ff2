#include "program/command/commands.h"
#include "program/command/modulecommand.h"
#include "program/commandline.h"

namespace velmora::cli {

void addMonitorsCommand(CommandLine& commandLine)
{
    commandLine.addCommand("monitors", "Show the results of the on-board monitors' tests",
                           [](GlobalOptions const& options) {
                               return showTopic(options, &Car::monitors,
                                                {ErrorKind::NotSupported,
                                                 "No control module offers monitor test results",
                                                 {"older vehicles may have oxygen sensor tests only: velmora oxygen"}});
                           });
}

} // namespace velmora::cli
