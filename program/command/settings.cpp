#include "libvelmora/report/json.h"
#include "libvelmora/session/settingsstore.h"
#include "libvelmora/session/vehiclesettings.h"
#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/layout.h"
#include "program/view/printtext.h"

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
        fmt::print("{}", printed(document));
        return;
    }
    std::vector<std::vector<Cell>> rows;
    for (VehicleSetting const& setting : vehicleSettings()) {
        rows.push_back({{setting.name}, {withUnit(setting, shownSetting(setting, store))}, {shownRange(setting)}});
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
    printText(fmt::format("{}\n{}{}{}{}", setting.title, wrapped(setting.explanation, 76, "  "),
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
    command->add_option("NAME", chosen->name, "Setting to explain, such as displacement; without, all are listed")
        ->type_name("");
    command->add_option("VALUE", chosen->value, "What to set it to, in the unit of the list, such as 1.6")
        ->type_name("");
}

} // namespace velmora::cli
