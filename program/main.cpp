#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/interrupt.h"

int main(int argc, char** argv)
{
    velmora::cli::Interrupt const interrupt;
    velmora::cli::CommandLine commandLine;
    velmora::cli::addCommands(commandLine);
    return static_cast<int>(commandLine.run(argc, argv));
}
