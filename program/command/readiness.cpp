#include "program/command/commands.h"
#include "program/command/modulecommand.h"
#include "program/commandline.h"

namespace velmora::cli {

void addReadinessCommand(CommandLine& commandLine)
{
    commandLine.addCommand("readiness", "Show which monitors have run since codes were cleared",
                           [](GlobalOptions const& options) {
                               return showTopic(options, &Car::readiness,
                                                {ErrorKind::NotSupported,
                                                 "No control module reports its readiness",
                                                 {"some gearboxes and brakes don't; leave --ecu out to ask all"}});
                           });
}

} // namespace velmora::cli
