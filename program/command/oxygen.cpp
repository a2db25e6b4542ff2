#include "program/command/commands.h"
#include "program/command/modulecommand.h"
#include "program/commandline.h"

namespace velmora::cli {

void addOxygenCommand(CommandLine& commandLine)
{
    commandLine.addCommand("oxygen", "Show the oxygen sensors, and their tests on legacy buses, those before CAN",
                           [](GlobalOptions const& options) {
                               return showTopic(options, &Car::oxygen,
                                                {ErrorKind::NotSupported,
                                                 "No control module reports oxygen sensors",
                                                 {"diesel engines have none, or don't report them"}});
                           });
}

} // namespace velmora::cli
