#include "velmora/command/commands.h"
#include "velmora/command/modulecommand.h"
#include "velmora/commandline.h"
#include "velmora/diagnosticreaders.h"

namespace velmora {

void addReadinessCommand(CommandLine& commandLine)
{
    commandLine.addCommand("readiness", "Show which monitors have run since codes were cleared",
                           [](GlobalOptions const& options) {
                               return showTopic(options, readReadiness,
                                                {ExitCode::NotSupported,
                                                 "No control module tells its readiness",
                                                 {"some gearboxes and brakes don't; leave --ecu out to ask all"}});
                           });
}

} // namespace velmora
