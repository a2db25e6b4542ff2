#include "libvelmora/session/vehiclesettings.h"

#include <velmora/error.h>
#include <velmora/settings.h>

#include <fmt/format.h>

#include <algorithm>
#include <charconv>
#include <cmath>
#include <limits>
#include <optional>
#include <vector>

namespace velmora {

namespace {

constexpr int hundredths = 2; // decimals

constexpr char const* unitWords[] = {"metric", "imperial"};
constexpr char const* gallonWords[] = {"us", "uk"};
constexpr char const* fuelWords[] = {"reported", "override"};
constexpr char const* ignitionWords[] = {"spark", "compression"};

constexpr VehicleSetting allSettings[] = {
    {"units", "Unit system", "", settings::unitSystem, 0, 0, 1, true, 0, unitWords,
     "The units that values are shown in. --units chooses for one run."},
    {"gallon", "Gallon", "", settings::gallon, 0, 0, 1, true, 0, gallonWords,
     "The gallon of the imperial units: of the US, 3.785 l, or of the United Kingdom, 4.546 l. --units imperial-uk "
     "chooses the latter for one run."},
    {"displacement",
     "Engine displacement",
     "l",
     settings::engineDisplacement,
     200,
     5,
     3000,
     false,
     hundredths,
     {},
     "Of all cylinders together. The air that an engine without an air flow sensor takes in is reckoned from it, and "
     "from that the fuel consumption."},
    {"efficiency",
     "Volumetric efficiency",
     "%",
     settings::volumetricEfficiency,
     85,
     0,
     100,
     true,
     0,
     {},
     "How well the cylinders fill. Engines with two valves a cylinder reach some 75 to 85, with four some 85 to 95."},
    {"weight",
     "Vehicle weight",
     "kg",
     settings::vehicleWeight,
     1500,
     1,
     60000,
     false,
     0,
     {},
     "With load and people. Power and torque are reckoned from it and the acceleration."},
    {"correction",
     "Fuel correction",
     "",
     settings::fuelCorrectionFactor,
     100,
     10,
     1000,
     false,
     hundredths,
     {},
     "Factor on the fuel consumption shown. If the pump says 5 % more than the display, set 1.05."},
    {"fuel", "Kind of fuel", "", settings::fuelTypeOverride, 0, 0, 1, true, 0, fuelWords,
     "reported takes what the vehicle reports, override the setting ignition in its place."},
    {"ignition", "Ignition", "", settings::ignitionType, 0, 0, 1, true, 0, ignitionWords,
     "spark is petrol, gas or alcohol, compression is diesel. Counts with fuel set to override."},
};

int readStored(VehicleSetting const& setting, obd::ISettings& store)
{
    int value = setting.fallback;
    store.getInt(setting.key, value);
    bool const outside = value < setting.lowest || value > setting.highest;
    return setting.strict && outside ? setting.fallback : value;
}

std::string shown(VehicleSetting const& setting, int stored)
{
    if (!setting.words.empty()) {
        return setting.words[static_cast<std::size_t>(stored)];
    }
    return setting.decimals == hundredths ? fmt::format("{:.2f}", stored / 100.0) : std::to_string(stored);
}

std::optional<double> parseNumber(std::string const& text)
{
    double number = 0.0;
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    bool const whole = error == std::errc() && end == text.data() + text.size() && std::isfinite(number);
    return whole ? std::optional(number) : std::nullopt;
}

std::optional<int> parseStored(VehicleSetting const& setting, std::string const& text)
{
    if (!setting.words.empty()) {
        auto const found = std::ranges::find(setting.words, text);
        return found != setting.words.end() ? std::optional(static_cast<int>(found - setting.words.begin()))
                                            : std::nullopt;
    }
    std::optional<double> const number = parseNumber(text);
    if (!number) {
        return std::nullopt;
    }
    double const scaled = setting.decimals == hundredths ? *number * 100.0 : *number;
    double const stored = std::round(scaled);
    bool const fits = std::abs(scaled - stored) < 1e-6 && stored >= setting.lowest && stored <= setting.highest;
    return fits ? std::optional(static_cast<int>(stored)) : std::nullopt;
}

} // namespace

std::span<VehicleSetting const> vehicleSettings()
{
    return allSettings;
}

VehicleSetting const& findSetting(std::string const& name)
{
    auto const* const found =
        std::ranges::find_if(allSettings, [&name](VehicleSetting const& setting) { return setting.name == name; });
    if (found == std::end(allSettings)) {
        std::vector<char const*> names;
        std::ranges::transform(allSettings, std::back_inserter(names), &VehicleSetting::name);
        throw Error(ErrorKind::WrongUse, "There is no setting \"" + name + "\"",
                    {fmt::format("these there are: {}", fmt::join(names, ", "))});
    }
    return *found;
}

std::string shownSetting(VehicleSetting const& setting, obd::ISettings& store)
{
    return shown(setting, readStored(setting, store));
}

std::string shownDefault(VehicleSetting const& setting)
{
    return shown(setting, setting.fallback);
}

std::string shownRange(VehicleSetting const& setting)
{
    if (setting.words.empty()) {
        return shown(setting, setting.lowest) + " to " + shown(setting, setting.highest);
    }
    auto const leading = setting.words.first(setting.words.size() - 1);
    return fmt::format("{} or {}", fmt::join(leading, ", "), setting.words.back());
}

std::string storedRange(VehicleSetting const& setting)
{
    if (setting.words.empty()) {
        return fmt::format("{} to {}{}", setting.lowest, setting.highest,
                           setting.decimals == hundredths ? " hundredths" : "");
    }
    std::string text;
    for (std::size_t number = 0; number < setting.words.size(); ++number) {
        text += fmt::format("{}{} ({})", number == 0 ? "" : " or ", number, setting.words[number]);
    }
    return text;
}

void setSetting(VehicleSetting const& setting, std::string const& text, obd::ISettings& store)
{
    std::optional<int> const stored = parseStored(setting, text);
    if (!stored) {
        std::string const precision =
            setting.decimals == hundredths ? ", with at most two digits behind the point" : "";
        throw Error(ErrorKind::WrongUse, fmt::format("\"{}\" is no value for {}", text, setting.name),
                    {fmt::format("expected {}{}{}{}", shownRange(setting), *setting.unit != '\0' ? " " : "",
                                 setting.unit, precision)});
    }
    store.setInt(setting.key, *stored);
}

bool isKnownKey(std::string_view key)
{
    static constexpr std::string_view others[] = {
        "common/language",
        "connection/bt/address",
        "connection/bt/name",
        "connection/bt/port",
        "connection/bus",
        "connection/protocol",
        "connection/serial/autobaudrate",
        "connection/serial/baudrate",
        "connection/serial/description",
        "connection/serial/device",
        "connection/serial/initialbaudrate",
        "connection/tcp/address",
        "connection/tcp/port",
        "velmora/foundport",
        "velmora/port",
    };
    static constexpr std::string_view groups[] = {"bluetooth/", "limit/"};
    return std::ranges::find(others, key) != std::end(others) ||
           std::ranges::find(allSettings, key, [](VehicleSetting const& each) { return std::string_view(each.key); }) !=
               std::end(allSettings) ||
           std::ranges::any_of(groups, [key](std::string_view group) { return key.starts_with(group); });
}

bool storedHundredths(std::string const& key, double number, int& value)
{
    auto const* const found =
        std::ranges::find_if(allSettings, [&key](VehicleSetting const& setting) { return setting.key == key; });
    double const stored = std::round(number * 100.0);
    if (found == std::end(allSettings) || found->decimals != hundredths ||
        !(std::abs(stored) <= std::numeric_limits<int>::max())) {
        return false;
    }
    value = static_cast<int>(stored);
    return true;
}

} // namespace velmora
