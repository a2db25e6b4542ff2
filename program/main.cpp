#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/interrupt.h"
#include "program/terminal/terminal.h"

int main(int argc, char** argv)
{
    velmora::cli::Terminal::useCharacters();
    velmora::cli::Interrupt const interrupt;
    velmora::cli::CommandLine commandLine;
    velmora::cli::addCommands(commandLine);
    return static_cast<int>(commandLine.run(argc, argv));
}
