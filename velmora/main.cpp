#include "velmora/command/commands.h"
#include "velmora/commandline.h"
#include "velmora/interrupt.h"

int main(int argc, char** argv)
{
    velmora::Interrupt const interrupt;
    velmora::CommandLine commandLine;
    velmora::addCommands(commandLine);
    return static_cast<int>(commandLine.run(argc, argv));
}
