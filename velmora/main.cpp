#include "velmora/command/commands.h"
#include "velmora/commandline.h"

int main(int argc, char** argv)
{
    velmora::CommandLine commandLine;
    velmora::addCommands(commandLine);
    return static_cast<int>(commandLine.run(argc, argv));
}
