#include "common/text/layout.h"
#include "program/command/commands.h"
#include "program/command/keepscan.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/json.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/limits.h>
#include <velmora/settingsfile.h>

#include <fmt/format.h>

namespace velmora::cli {

namespace {

struct SettingsOptions
{
    std::string name;
    std::string value;
};

using Setting = SettingsFile::Setting;

Json toJson(Setting const& setting)
{
    return {{"name", setting.name},   {"title", setting.title},
            {"value", setting.value}, {"unit", textOrNull(setting.unit)},
            {"range", setting.range}, {"default", setting.fallback},
            {"key", setting.key}};
}

constexpr char const* limitPrefix = "limit.";

Json limitJson(std::string const& sensor, SensorLimits const& limits)
{
    return {{"name", limitPrefix + sensor},
            {"title", "Limit of " + sensor},
            {"value", textOrNull(limitText(limits.of(sensor)))},
            {"unit", nullptr},
            {"range", "highest, or lowest..highest"},
            {"default", nullptr},
            {"key", "limit/" + sensor}};
}

// A value of "none" takes the limit away.
void explainLimit(SettingsOptions const& chosen, GlobalOptions const& options)
{
    SensorLimits limits(options.settingsFile);
    std::string const sensor = limitKey(chosen.name.substr(std::string(limitPrefix).size()));
    if (!chosen.value.empty()) {
        limits.set(sensor, chosen.value == "none" ? SensorLimit() : parseLimit(chosen.value));
    }
    if (options.json) {
        fmt::print("{}", printed(limitJson(sensor, limits)));
        return;
    }
    printText(fmt::format("Limit of {}\n{}{}", sensor,
                          wrapped("In the sensor's metric unit: the highest value, such as 6000, or a range such as "
                                  "11.8..14.8, or none. live marks values outside.",
                                  76, "  "),
                          labelledLine("Value", limitText(limits.of(sensor)))));
}

std::string withUnit(Setting const& setting, std::string const& value)
{
    return setting.unit.empty() ? value : value + " " + setting.unit;
}

// A mistyped key looks as if it were set.
void tellUnknownKeys(SettingsFile const& file, GlobalOptions const& options)
{
    std::vector<std::string> keys = file.unknownKeys();
    std::erase_if(keys, [](std::string const& key) { return key == historyKeepKey || key == historyNameKey; });
    if (!keys.empty() && !options.quiet) {
        tellText(fmt::format("Nothing reads {} in {}\n", fmt::join(keys, ", "), file.path()));
    }
}

void list(SettingsFile const& file, GlobalOptions const& options)
{
    SensorLimits const limits(options.settingsFile);
    if (options.json) {
        Json document = Json::array();
        for (Setting const& setting : file.settings()) {
            document.push_back(toJson(setting));
        }
        for (std::string const& sensor : limits.sensors()) {
            document.push_back(limitJson(sensor, limits));
        }
        fmt::print("{}", printed(document));
        return;
    }
    std::vector<std::vector<Cell>> rows;
    for (Setting const& setting : file.settings()) {
        rows.push_back({{setting.name}, {withUnit(setting, setting.value)}, {setting.range}});
    }
    for (std::string const& sensor : limits.sensors()) {
        rows.push_back({{limitPrefix + sensor}, {limitText(limits.of(sensor))}, {}});
    }
    printText(fmt::format("{}\n{}\n  velmora settings SETTING explains one, velmora settings SETTING VALUE sets it\n",
                          file.path(), drawColumns(rows, "  ", outputStyle(options))));
}

void explain(Setting const& setting, GlobalOptions const& options)
{
    if (options.json) {
        fmt::print("{}", printed(toJson(setting)));
        return;
    }
    printText(fmt::format("{}\n{}{}{}{}", setting.title, wrapped(setting.explanation, 76, "  ", outputStyle(options)),
                          labelledLine("Value", withUnit(setting, setting.value)),
                          labelledLine("Range", withUnit(setting, setting.range)),
                          labelledLine("Default", withUnit(setting, setting.fallback))));
}

ExitCode settings(SettingsOptions const& chosen, GlobalOptions const& options)
{
    SettingsFile file(options.settingsFile);
    if (chosen.name.empty()) {
        list(file, options);
        tellUnknownKeys(file, options);
        return ExitCode::Done;
    }
    if (chosen.name.starts_with(limitPrefix)) {
        explainLimit(chosen, options);
        return ExitCode::Done;
    }
    if (!chosen.value.empty()) {
        file.set(chosen.name, chosen.value);
    }
    explain(file.setting(chosen.name), options);
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
        ->add_option("SETTING", chosen->name,
                     "Setting to explain, such as displacement, or limit.SENSOR; without, all are listed")
        ->type_name("");
    command->add_option("VALUE", chosen->value, "What to set it to, in the unit of the list, such as 1.6")
        ->type_name("");
}

} // namespace velmora::cli
