#include "velmora/command/commands.h"

namespace velmora {

void addCommands(CommandLine& commandLine)
{
    addPortsCommand(commandLine);
}

} // namespace velmora
