#include "program/command/commands.h"
#include "program/command/modulecommand.h"
#include "program/commandline.h"

namespace velmora::cli {

void addCountersCommand(CommandLine& commandLine)
{
    commandLine.addCommand("counters", "Show how often monitors could run and did", [](GlobalOptions const& options) {
        return showTopic(options, &Car::counters,
                         {ErrorKind::NotSupported,
                          "No control module keeps in-use counters",
                          {"vehicles before about 2008 have none"}});
    });
}

} // namespace velmora::cli
