#include "program/command/codesuds.h"

#include "program/command/commandcar.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/error.h>
#include <velmora/modules.h>

#include <fmt/format.h>

#include <algorithm>

namespace velmora::cli {

namespace {

void requireCodes(CommandCar& car, std::vector<UdsModuleReport> const& modules)
{
    auto const any = [&modules](TopicAnswer answer) {
        return std::any_of(modules.begin(), modules.end(),
                           [answer](UdsModuleReport const& module) { return module.answer == answer; });
    };
    if (any(TopicAnswer::Read)) {
        return;
    }
    std::vector<std::string> const hints = {"`velmora codes` asks the way that every OBD vehicle knows"};
    if (any(TopicAnswer::Refused)) {
        throw Error(ErrorKind::NotSupported, "No control module tells its codes by service 19 or 18", hints);
    }
    throw silentVehicle(car, "No control module answered service 19 or 18", hints);
}

} // namespace

ExitCode udsCodes(std::string const& named, GlobalOptions const& options)
{
    CommandCar car(options);
    std::vector<UdsModuleReport> const modules = car.udsCodes(named);
    if (options.json) {
        fmt::print("{}", toJson(modules));
    } else {
        printText(toText(modules, textStyle(options)));
    }
    flushOutput();
    requireCodes(car, modules);
    return ExitCode::Done;
}

} // namespace velmora::cli
