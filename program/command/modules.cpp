#include "program/command/commandcar.h"
#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/error.h>
#include <velmora/modules.h>

#include <fmt/format.h>

#include <memory>

namespace velmora::cli {

namespace {

ExitCode modules(ModuleSearch const& search, GlobalOptions const& options)
{
    CommandCar car(options);
    std::vector<FoundModule> const found = car.findModules(search);
    if (options.json) {
        fmt::print("{}", toJson(found));
    } else {
        printText(toText(found, textStyle(options)));
    }
    flushOutput();
    if (found.empty()) {
        throw Error(ErrorKind::NotSupported, "No control module answered",
                    {"a gateway may keep them behind it", "is the ignition on?"});
    }
    return ExitCode::Done;
}

} // namespace

void addModulesCommand(CommandLine& commandLine)
{
    auto const search = std::make_shared<ModuleSearch>();
    CLI::App* const command = commandLine.addCommand(
        "modules", "List the control modules beyond OBD, looked for on CAN and remembered by VIN",
        [search](GlobalOptions const& options) { return modules(*search, options); });
    command->add_flag("--scan", search->anew, "Look for them anew: half a minute, with the vehicle standing");
    command->add_flag("--all", search->identifiers, "Also all that ISO 14229 has identifiers for, F180 to F19F");
}

} // namespace velmora::cli
