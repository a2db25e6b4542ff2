#include "common/text/layout.h"
#include "libvelmora/read/sensorlimits.h"
#include "libvelmora/session/settingsstore.h"
#include "libvelmora/session/vehiclesettings.h"
#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/json.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/error.h>

#include <fmt/format.h>

namespace velmora::cli {

namespace {

struct SettingsOptions
{
    std::string name;
    std::string value;
};

SettingsStore openStore(GlobalOptions const& options)
{
    return SettingsStore(options.settingsFile.empty() ? SettingsStore::defaultFile()
                                                      : std::filesystem::path(options.settingsFile));
}

Json toJson(VehicleSetting const& setting, SettingsStore& store)
{
    return {{"name", setting.name},
            {"title", setting.title},
            {"value", shownSetting(setting, store)},
            {"unit", textOrNull(setting.unit)},
            {"range", shownRange(setting)},
            {"default", shownDefault(setting)},
            {"key", setting.key}};
}

constexpr char const* limitPrefix = "limit.";

Json limitJson(std::string const& sensor, SettingsStore& store)
{
    return {{"name", limitPrefix + sensor},
            {"title", "Limit of " + sensor},
            {"value", textOrNull(limitText(limitOf(store, sensor)))},
            {"unit", nullptr},
            {"range", "highest, or lowest..highest"},
            {"default", nullptr},
            {"key", "limit/" + sensor}};
}

// A value of "none" takes the limit away.
void explainLimit(SettingsOptions const& chosen, SettingsStore& store, GlobalOptions const& options)
{
    std::string const sensor = limitKey(chosen.name.substr(std::string(limitPrefix).size()));
    if (!chosen.value.empty()) {
        setLimit(store, sensor, chosen.value == "none" ? SensorLimit() : parseLimit(chosen.value));
        store.sync();
    }
    if (options.json) {
        fmt::print("{}", printed(limitJson(sensor, store)));
        return;
    }
    printText(fmt::format("Limit of {}\n{}{}", sensor,
                          wrapped("In the sensor's metric unit: the highest value, such as 6000, or a range such as "
                                  "11.8..14.8, or none. live marks values outside.",
                                  76, "  "),
                          labelledLine("Value", limitText(limitOf(store, sensor)))));
}

std::string withUnit(VehicleSetting const& setting, std::string const& value)
{
    return *setting.unit != '\0' ? value + " " + setting.unit : value;
}

void list(SettingsStore& store, GlobalOptions const& options)
{
    if (options.json) {
        Json document = Json::array();
        for (VehicleSetting const& setting : vehicleSettings()) {
            document.push_back(toJson(setting, store));
        }
        for (std::string const& sensor : limitedSensors(store)) {
            document.push_back(limitJson(sensor, store));
        }
        fmt::print("{}", printed(document));
        return;
    }
    std::vector<std::vector<Cell>> rows;
    for (VehicleSetting const& setting : vehicleSettings()) {
        rows.push_back({{setting.name}, {withUnit(setting, shownSetting(setting, store))}, {shownRange(setting)}});
    }
    for (std::string const& sensor : limitedSensors(store)) {
        rows.push_back({{limitPrefix + sensor}, {limitText(limitOf(store, sensor))}, {}});
    }
    printText(fmt::format("{}\n{}\n  velmora settings NAME explains one, velmora settings NAME VALUE sets it\n",
                          store.file().string(), drawColumns(rows, "  ", outputStyle(options))));
}

void explain(VehicleSetting const& setting, SettingsStore& store, GlobalOptions const& options)
{
    if (options.json) {
        fmt::print("{}", printed(toJson(setting, store)));
        return;
    }
    printText(fmt::format("{}\n{}{}{}{}", setting.title, wrapped(setting.explanation, 76, "  ", outputStyle(options)),
                          labelledLine("Value", withUnit(setting, shownSetting(setting, store))),
                          labelledLine("Range", withUnit(setting, shownRange(setting))),
                          labelledLine("Default", withUnit(setting, shownDefault(setting)))));
}

ExitCode settings(SettingsOptions const& chosen, GlobalOptions const& options)
{
    SettingsStore store = openStore(options);
    if (chosen.name.empty()) {
        list(store, options);
        return ExitCode::Done;
    }
    if (chosen.name.starts_with(limitPrefix)) {
        explainLimit(chosen, store, options);
        return ExitCode::Done;
    }
    VehicleSetting const& setting = findSetting(chosen.name);
    if (!chosen.value.empty()) {
        setSetting(setting, chosen.value, store);
        store.sync();
    }
    explain(setting, store, options);
    return ExitCode::Done;
}

} // namespace

void addSettingsCommand(CommandLine& commandLine)
{
    auto const chosen = std::make_shared<SettingsOptions>();
    CLI::App* const command =
        commandLine.addCommand("settings", "List, explain and set the settings of the vehicle",
                               [chosen](GlobalOptions const& options) { return settings(*chosen, options); });
    command
        ->add_option("NAME", chosen->name,
                     "Setting to explain, such as displacement, or limit.SENSOR; without, all are listed")
        ->type_name("");
    command->add_option("VALUE", chosen->value, "What to set it to, in the unit of the list, such as 1.6")
        ->type_name("");
}

} // namespace velmora::cli
