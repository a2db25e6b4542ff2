#include "libvelmora/watch/watchsettings.h"

#include "libvelmora/poll/sensorwish.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <toml++/toml.h>

#include <algorithm>
#include <charconv>
#include <fstream>
#include <functional>
#include <iterator>

namespace velmora {

namespace {

constexpr double lowestVolts = 6.0;
constexpr double highestVolts = 16.0;

// Reads the file's tables and takes down what is wrong with them, so that all is told at once.
class SettingsReader
{
public:
    explicit SettingsReader(std::string name) : m_name(std::move(name)) {}

    WatchSettings read(toml::table const& root);
    std::vector<std::string> const& mistakes() const { return m_mistakes; }

private:
    using Taker = std::function<void(toml::node const&, std::string const&)>;

    void readTable(toml::table const& table, std::string const& prefix, std::map<std::string, Taker> const& keys);
    void readOutput(toml::node const& node);
    void readSensors(toml::node const& node);
    void mistake(toml::node const& node, std::string const& key, std::string const& what);

    template <typename T>
    Taker into(T& target, char const* expected);
    template <typename Duration>
    Taker duration(Duration& target);
    Taker volts(double& target, double lowest);
    Taker vehicle();
    Taker vin();
    Taker wake();

    std::string const m_name;
    std::vector<std::string> m_mistakes;
    WatchSettings m_settings;
};

void SettingsReader::mistake(toml::node const& node, std::string const& key, std::string const& what)
{
    m_mistakes.push_back(fmt::format("{}:{}: {}: {}", m_name, node.source().begin.line, key, what));
}

void SettingsReader::readTable(toml::table const& table, std::string const& prefix,
                               std::map<std::string, Taker> const& keys)
{
    for (auto const& [key, node] : table) {
        std::string const name(key.str());
        auto const found = keys.find(name);
        if (found != keys.end()) {
            found->second(node, prefix + name);
            continue;
        }
        std::string list;
        for (auto const& [known, taker] : keys) {
            list += (list.empty() ? "" : ", ") + known;
        }
        mistake(node, prefix + name, "is not known here; " + list + " are");
    }
}

template <typename T>
SettingsReader::Taker SettingsReader::into(T& target, char const* expected)
{
    return [this, &target, expected](toml::node const& node, std::string const& key) {
        if (std::optional<T> const value = node.value_exact<T>()) {
            target = *value;
        } else {
            mistake(node, key, std::string("must be ") + expected);
        }
    };
}

template <typename Duration>
SettingsReader::Taker SettingsReader::duration(Duration& target)
{
    return [this, &target](toml::node const& node, std::string const& key) {
        auto const value = parseDuration(node.value_exact<std::string>().value_or(""));
        if (value && std::chrono::floor<Duration>(*value).count() > 0) {
            target = std::chrono::floor<Duration>(*value);
        } else {
            mistake(node, key, "must be a time in quotes, such as \"90s\" or \"10min\"");
        }
    };
}

SettingsReader::Taker SettingsReader::volts(double& target, double lowest)
{
    return [this, &target, lowest](toml::node const& node, std::string const& key) {
        std::optional<double> const value = node.value<double>();
        if (value && *value >= lowest && *value <= highestVolts) {
            target = *value;
        } else {
            mistake(node, key,
                    fmt::format("must be a number of volts from {} to {}, of a 12 V system", lowest, highestVolts));
        }
    };
}

SettingsReader::Taker SettingsReader::vehicle()
{
    return [this](toml::node const& node, std::string const& key) {
        std::string const name = node.value_exact<std::string>().value_or("");
        if (isVehicleName(name)) {
            m_settings.vehicle = name;
        } else {
            mistake(node, key, "must be a name of letters, digits, - and _");
        }
    };
}

SettingsReader::Taker SettingsReader::vin()
{
    return [this](toml::node const& node, std::string const& key) {
        std::string const text = node.value_exact<std::string>().value_or("");
        if (text != "none" && text != "full") {
            mistake(node, key, "must be \"none\" or \"full\"");
        }
        m_settings.fullVin = text == "full";
    };
}

SettingsReader::Taker SettingsReader::wake()
{
    return [this](toml::node const& node, std::string const& key) {
        if (!parseWake(node.value_exact<std::string>().value_or(""), m_settings.battery)) {
            mistake(node, key, "must be \"voltage\" or such as \"every 30min\"");
        }
    };
}

void SettingsReader::readSensors(toml::node const& node)
{
    toml::array const* const list = node.as_array();
    if (list == nullptr) {
        mistake(node, "sensors", "must be a list of texts, such as [\"RPM\", \"SPEED@10hz\"]");
        return;
    }
    for (toml::node const& each : *list) {
        std::string const text = each.value_exact<std::string>().value_or("");
        try {
            parseSensorWish(text);
            m_settings.sensors.push_back(text);
        } catch (Error const& error) {
            mistake(each, "sensors", error.what());
        }
    }
}

// "to" is the address; the other keys are its settings.
void SettingsReader::readOutput(toml::node const& node)
{
    toml::table const* const table = node.as_table();
    std::optional<std::string> const to = table == nullptr ? std::nullopt : (*table)["to"].value_exact<std::string>();
    if (!to) {
        mistake(node, "output.to", "is missing: where the output goes, such as \"csv:drive.csv\"");
        return;
    }
    try {
        OutputAddress address = parseOutputAddress(*to);
        for (auto const& [key, value] : *table) {
            std::string const name(key.str());
            std::optional<std::string> const text = value.value<std::string>();
            std::optional<std::int64_t> const number = value.value_exact<std::int64_t>();
            if (name == "to") {
                continue;
            }
            if (!text && !number) {
                mistake(value, "output." + name, "must be a text or a whole number");
                continue;
            }
            addOption(address, name, number ? std::to_string(*number) : *text);
        }
        m_settings.outputs.push_back(std::move(address));
    } catch (Error const& error) {
        mistake(*table, "output", error.what());
    }
}

WatchSettings SettingsReader::read(toml::table const& root)
{
    BatterySettings& battery = m_settings.battery;
    std::map<std::string, Taker> const batteryKeys = {
        {"stop_after", duration(battery.stopAfter)},
        {"settle", duration(battery.settle)},
        {"voltage_every", duration(battery.voltageEvery)},
        {"running_volts", volts(battery.runningVolts, lowestVolts)},
        {"low_volts", volts(battery.lowVolts, lowestVolts)},
        {"wake_change", volts(battery.wakeChange, 0.1)},
        {"still_limit", duration(battery.stillLimit)},
        {"electric", into(battery.electric, "true or false")},
        {"wake", wake()},
    };
    readTable(root, "",
              {{"port", into(m_settings.port, "a text")},
               {"vehicle", vehicle()},
               {"vin", vin()},
               {"fast", into(m_settings.fast, "true or false")},
               {"codes_every", duration(m_settings.codesEvery)},
               {"sensors", [this](toml::node const& node, std::string const&) { readSensors(node); }},
               {"output",
                [this](toml::node const& node, std::string const& key) {
                    toml::array const* const list = node.as_array();
                    if (list == nullptr) {
                        mistake(node, key, "must be written as [[output]]");
                        return;
                    }
                    std::ranges::for_each(*list, [this](toml::node const& each) { readOutput(each); });
                }},
               {"battery", [&](toml::node const& node, std::string const& key) {
                    if (toml::table const* const table = node.as_table()) {
                        readTable(*table, "battery.", batteryKeys);
                    } else {
                        mistake(node, key, "must be a table: [battery]");
                    }
                }}});
    return m_settings;
}

} // namespace

WatchSettings parseWatchSettings(std::string_view text, std::string const& name)
{
    SettingsReader reader(name);
    WatchSettings settings;
    try {
        settings = reader.read(toml::parse(text));
    } catch (toml::parse_error const& error) {
        throw Error(ErrorKind::WrongUse,
                    fmt::format("{}:{}: {}", name, error.source().begin.line, error.description()));
    }
    if (!reader.mistakes().empty()) {
        throw Error(ErrorKind::WrongUse, fmt::format("{}", fmt::join(reader.mistakes(), "\n")));
    }
    return settings;
}

WatchSettings readWatchSettings(std::string const& file)
{
    std::ifstream in(file, std::ios::binary);
    std::string const text{std::istreambuf_iterator<char>(in), {}};
    if (!in) {
        throw Error(ErrorKind::WrongUse, "Could not read " + file, {"does the file exist, and may you read it?"});
    }
    return parseWatchSettings(text, file);
}

std::optional<std::chrono::milliseconds> parseDuration(std::string_view text)
{
    struct Unit
    {
        std::string_view name;
        std::int64_t millis;
    };
    static constexpr Unit units[] = {{"ms", 1}, {"s", 1000}, {"min", 60000}, {"h", 3600000}};
    constexpr std::int64_t highest = 1000000;
    std::int64_t value = 0;
    char const* const end = text.data() + text.size();
    auto const [stop, error] = std::from_chars(text.data(), end, value);
    auto const* const unit = std::ranges::find(units, std::string_view(stop, end), &Unit::name);
    if (error != std::errc() || value <= 0 || value > highest || unit == std::end(units)) {
        return std::nullopt;
    }
    return std::chrono::milliseconds(value * unit->millis);
}

bool parseWake(std::string_view text, BatterySettings& settings)
{
    if (text == "voltage") {
        settings.wakeEvery.reset();
        return true;
    }
    std::string_view const every = "every ";
    auto const pause = text.starts_with(every) ? parseDuration(text.substr(every.size())) : std::nullopt;
    if (!pause || *pause < std::chrono::minutes(1)) {
        return false;
    }
    settings.wakeEvery = std::chrono::floor<std::chrono::minutes>(*pause);
    return true;
}

bool isVehicleName(std::string_view text)
{
    return !text.empty() && text.size() <= 64 && std::ranges::all_of(text, [](char each) {
        return (each >= 'a' && each <= 'z') || (each >= 'A' && each <= 'Z') || (each >= '0' && each <= '9') ||
               each == '-' || each == '_';
    });
}

} // namespace velmora
