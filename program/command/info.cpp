#include "libvelmora/read/diagnosticreaders.h"
#include "program/command/commands.h"
#include "program/command/commandsession.h"
#include "program/command/modulecommand.h"
#include "program/commandline.h"

namespace velmora::cli {

namespace {

ExitCode info(GlobalOptions const& options)
{
    CommandSession session(options);
    session.connect();
    print(readModules(session, readInfo), options);
    return ExitCode::Done;
}

} // namespace

void addInfoCommand(CommandLine& commandLine)
{
    commandLine.addCommand("info", "Show what the control modules report about themselves and the vehicle", info);
}

} // namespace velmora::cli
