#include "velmora/command/commands.h"
#include "velmora/command/modulecommand.h"
#include "velmora/commandline.h"
#include "velmora/diagnosticreaders.h"

namespace velmora {

void addCountersCommand(CommandLine& commandLine)
{
    commandLine.addCommand("counters", "Show how often monitors could run and did", [](GlobalOptions const& options) {
        return showTopic(options, readCounters,
                         {ExitCode::NotSupported,
                          "No control module keeps in-use counters",
                          {"vehicles before about 2008 have none"}});
    });
}

} // namespace velmora
