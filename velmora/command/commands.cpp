#include "velmora/command/commands.h"

namespace velmora {

void addCommands(CommandLine& commandLine)
{
    addScanCommand(commandLine);
    addSensorsCommand(commandLine);
    addConsoleCommand(commandLine);
    addSimulateCommand(commandLine);
    addPortsCommand(commandLine);
}

} // namespace velmora
