#include "program/command/commands.h"
#include "program/command/infouds.h"
#include "program/command/modulecommand.h"
#include "program/commandline.h"

#include <memory>

namespace velmora::cli {

namespace {

ExitCode info(GlobalOptions const& options)
{
    CommandCar car(options);
    print(car.info(), options);
    return ExitCode::Done;
}

} // namespace

void addInfoCommand(CommandLine& commandLine)
{
    auto const uds = std::make_shared<bool>(false);
    CLI::App* const command =
        commandLine.addCommand("info", "Show what the control modules report about themselves and the vehicle",
                               [uds](GlobalOptions const& options) { return *uds ? udsInfo(options) : info(options); });
    command->add_flag("--uds", *uds,
                      "Also the identifiers of ISO 14229 or ISO 14230, such as part numbers and\n"
                      "software versions, as far as the modules tell them");
}

} // namespace velmora::cli
