#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/interrupt.h"

int main(int argc, char** argv)
{
    velmora::Interrupt const interrupt;
    velmora::CommandLine commandLine;
    velmora::addCommands(commandLine);
    return static_cast<int>(commandLine.run(argc, argv));
}
