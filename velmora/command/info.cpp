#include "velmora/command/commands.h"
#include "velmora/command/modulecommand.h"
#include "velmora/commandline.h"
#include "velmora/diagnosticreaders.h"

namespace velmora {

namespace {

ExitCode info(GlobalOptions const& options)
{
    Session session(options);
    session.connect();
    print(readModules(session, readInfo), options);
    return ExitCode::Done;
}

} // namespace

void addInfoCommand(CommandLine& commandLine)
{
    commandLine.addCommand("info", "Show what the control modules tell of themselves and the vehicle", info);
}

} // namespace velmora
