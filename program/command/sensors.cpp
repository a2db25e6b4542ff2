#include "common/text/layout.h"
#include "program/command/commandcar.h"
#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/view/json.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/offers.h>

#include <fmt/format.h>
#include <fmt/ostream.h>

#include <memory>

namespace velmora::cli {

namespace {

using Service = ModuleOffers::Service;
using Value = ModuleOffers::Value;
using Rows = std::vector<std::vector<Cell>>;

char const* serviceTitle(int number)
{
    return number == 1   ? "01 current data"
           : number == 6 ? "06 monitor tests"
           : number == 8 ? "08 system control"
                         : "09 vehicle information";
}

std::vector<std::string> identifiers(Service const& service)
{
    std::vector<std::string> texts;
    for (unsigned int const id : service.identifiers) {
        texts.push_back(fmt::format("{:02X}", id));
    }
    return texts;
}

// Why a set may lack what the module has; empty if it was read.
std::string whyUnknown(Service const& service)
{
    switch (service.answer) {
    case TopicAnswer::Silent:
        return " (not known in full: no answer)";
    case TopicAnswer::Unreadable:
        return " (not known in full: unreadable)";
    case TopicAnswer::Refused: // service 01 is one that all modules have
        return service.number == 1 ? " (not known in full: refused)" : "";
    default:
        return {};
    }
}

std::string range(Value const& value)
{
    return value.minimum && value.maximum ? fmt::format("{} to {}", *value.minimum, *value.maximum) : "text";
}

void addParameter(Rows& rows, ModuleOffers::Parameter const& parameter, bool all)
{
    std::string lead = fmt::format("{:02X}", parameter.pid);
    for (Value const& value : parameter.values) {
        rows.push_back({{lead}, {value.name}, {value.unit}, {range(value)}});
        if (all) {
            rows.back().push_back({parameter.offered ? "offered" : "-"});
        }
        lead.clear();
    }
}

void addLater(Rows& rows, ModuleOffers::LaterParameter const& later)
{
    std::string lead = fmt::format("{:02X}", later.pid);
    if (later.values.empty()) {
        rows.push_back({{lead}, {later.name + " (not decoded)"}});
    }
    for (ModuleOffers::LaterValue const& each : later.values) {
        rows.push_back({{lead}, {each.name}, {each.unit}, {fmt::format("{} ({})", each.sensor, each.standing)}});
        lead.clear();
    }
}

std::string offerText(ModuleOffers const& module, bool all, Style const& style)
{
    std::string text = fmt::format("Control module {:X}: {} ({})\n", module.id, module.name, module.description);
    for (Service const& service : module.services) {
        std::vector<std::string> const ids = identifiers(service);
        text += fmt::format("  {:<24} {}{}\n", serviceTitle(service.number),
                            ids.empty() ? "-" : fmt::format("{}", fmt::join(ids, " ")), whyUnknown(service));
    }
    Rows rows;
    for (ModuleOffers::Parameter const& parameter : module.parameters) {
        addParameter(rows, parameter, all);
    }
    for (ModuleOffers::LaterParameter const& later : module.further) {
        addLater(rows, later);
    }
    return text + "\n" + drawColumns(rows, "  ", style) + "\n";
}

Json valuesJson(std::vector<Value> const& values)
{
    Json list = Json::array();
    for (Value const& value : values) {
        list.push_back({{"uid", value.uid},
                        {"name", value.name},
                        {"unit", textOrNull(value.unit)},
                        {"minimum", value.minimum ? Json(*value.minimum) : Json(nullptr)},
                        {"maximum", value.maximum ? Json(*value.maximum) : Json(nullptr)}});
    }
    return list;
}

Json laterJson(ModuleOffers::LaterParameter const& later)
{
    Json values = Json::array();
    for (ModuleOffers::LaterValue const& each : later.values) {
        values.push_back({{"sensor", each.sensor},
                          {"name", each.name},
                          {"unit", textOrNull(each.unit)},
                          {"standing", each.standing}});
    }
    return {{"id", fmt::format("{:02X}", later.pid)}, {"name", later.name}, {"values", values}};
}

Json offerJson(ModuleOffers const& module)
{
    Json supported;
    Json answers;
    for (Service const& service : module.services) {
        std::string const number(serviceTitle(service.number), 2);
        supported[number] = identifiers(service);
        answers[number] = fmt::format("{}", fmt::streamed(service.answer));
    }
    Json parameters = Json::array();
    for (ModuleOffers::Parameter const& parameter : module.parameters) {
        parameters.push_back({{"id", fmt::format("{:02X}", parameter.pid)},
                              {"name", parameter.name},
                              {"offered", parameter.offered},
                              {"sensors", valuesJson(parameter.values)}});
    }
    Json rest = Json::array();
    for (ModuleOffers::LaterParameter const& later : module.further) {
        rest.push_back(laterJson(later));
    }
    return {{"id", fmt::format("{:X}", module.id)},
            {"name", textOrNull(module.name)},
            {"description", textOrNull(module.description)},
            {"supported", supported},
            {"answers", answers},
            {"parameters", parameters},
            {"undecoded", rest}};
}

ExitCode sensors(GlobalOptions const& options, bool all)
{
    CommandCar car(options);
    Json modules = Json::array();
    for (ModuleOffers const& module : car.offers(all)) {
        if (options.json) {
            modules.push_back(offerJson(module));
        } else {
            printText(offerText(module, all, outputStyle(options)));
        }
    }
    if (options.json) {
        fmt::print("{}", printed(modules));
    }
    return ExitCode::Done;
}

} // namespace

void addSensorsCommand(CommandLine& commandLine)
{
    auto const all = std::make_shared<bool>(false);
    CLI::App* const command =
        commandLine.addCommand("sensors", "List what the vehicle offers, by control module",
                               [all](GlobalOptions const& options) { return sensors(options, *all); });
    command->add_flag("--all", *all, "Also what the vehicle does not offer");
}

} // namespace velmora::cli
