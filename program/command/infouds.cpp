#include "program/command/infouds.h"

#include "program/command/commandcar.h"
#include "program/terminal/output.h"
#include "program/view/json.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/modules.h>

#include <fmt/format.h>

namespace velmora::cli {

namespace {

std::string identifiersText(ModuleIdentifiers const& identifiers)
{
    std::string text;
    for (auto const& [did, told] : identifiers) {
        text += fmt::format("  {:04X}  {:<58}  {}\n", did, identifierName(did), told);
    }
    return text;
}

Json identifiersJson(ModuleIdentifiers const& identifiers)
{
    Json json = Json::object();
    for (auto const& [did, told] : identifiers) {
        json[fmt::format("{:04X}", did)] = told;
    }
    return json;
}

} // namespace

ExitCode udsInfo(GlobalOptions const& options)
{
    CommandCar car(options);
    auto const modules = car.info();
    auto const told = car.identifiers();
    Json document = Json::parse(toJson(modules));
    std::string text;
    for (std::size_t i = 0; i < modules.size() && i < told.size(); ++i) {
        document[i]["identifiers"] = identifiersJson(told[i].report);
        text += (i == 0 ? "" : "\n") + toText(std::vector{modules[i]}, textStyle(options)) +
                identifiersText(told[i].report);
    }
    if (options.json) {
        fmt::print("{}", printed(document));
    } else {
        printText(text);
    }
    flushOutput();
    return ExitCode::Done;
}

} // namespace velmora::cli
