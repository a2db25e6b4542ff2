#include "libvelmora/watch/watchsettings.h"

#include "libvelmora/poll/sensorwish.h"
#include "libvelmora/record/checkedfile.h"
#include "libvelmora/watch/settingstable.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>

namespace velmora {

namespace {

constexpr double lowestVolts = 6.0;

// The file's keys.
class WatchSettingsReader
{
public:
    explicit WatchSettingsReader(std::string const& file) : m_table(file) {}

    WatchSettings read(toml::table const& root);
    std::vector<std::string> const& mistakes() const { return m_table.mistakes(); }

private:
    using Taker = SettingsTable::Taker;

    void readOutputs(toml::node const& node, std::string const& key);
    void readOutput(toml::node const& node);
    void readSensors(toml::node const& node);
    void readSignals(toml::node const& node, std::string const& key);
    void readBattery(toml::node const& node, std::string const& key);
    void readVehicle(toml::node const& node, std::string const& key);
    void readVin(toml::node const& node, std::string const& key);
    void readWake(toml::node const& node, std::string const& key);
    Taker by(void (WatchSettingsReader::*way)(toml::node const&, std::string const&));

    SettingsTable m_table;
    WatchSettings m_settings;
};

WatchSettingsReader::Taker WatchSettingsReader::by(void (WatchSettingsReader::*way)(toml::node const&,
                                                                                    std::string const&))
{
    return [this, way](toml::node const& node, std::string const& key) { (this->*way)(node, key); };
}

void WatchSettingsReader::readVehicle(toml::node const& node, std::string const& key)
{
    std::string const name = node.value_exact<std::string>().value_or("");
    if (isVehicleName(name)) {
        m_settings.vehicle = name;
    } else {
        m_table.mistake(node, key, "must be a name of letters, digits, - and _");
    }
}

void WatchSettingsReader::readVin(toml::node const& node, std::string const& key)
{
    std::string const text = node.value_exact<std::string>().value_or("");
    if (text != "none" && text != "full") {
        m_table.mistake(node, key, "must be \"none\" or \"full\"");
    }
    m_settings.fullVin = text == "full";
}

void WatchSettingsReader::readWake(toml::node const& node, std::string const& key)
{
    if (!parseWake(node.value_exact<std::string>().value_or(""), m_settings.battery)) {
        m_table.mistake(node, key, "must be \"voltage\" or such as \"every 30min\"");
    }
}

void WatchSettingsReader::readSensors(toml::node const& node)
{
    toml::array const* const list = node.as_array();
    if (list == nullptr) {
        m_table.mistake(node, "sensors", "must be a list of texts, such as [\"RPM\", \"SPEED@10hz\"]");
        return;
    }
    for (toml::node const& each : *list) {
        std::string const text = each.value_exact<std::string>().value_or("");
        try {
            parseSensorWish(text);
            m_settings.sensors.push_back(text);
        } catch (Error const& error) {
            m_table.mistake(each, "sensors", error.what());
        }
    }
}

void WatchSettingsReader::readSignals(toml::node const& node, std::string const& key)
{
    toml::array const* const list = node.as_array();
    if (list == nullptr) {
        m_table.mistake(node, key, "must be a list of files, such as [\"gearbox.toml\"]");
        return;
    }
    for (toml::node const& each : *list) {
        std::string const file = each.value_exact<std::string>().value_or("");
        if (file.empty()) {
            m_table.mistake(each, key, "must be the name of a file");
        } else {
            m_settings.signals.push_back(file);
        }
    }
}

// "to" is the address; the other keys are its settings.
void WatchSettingsReader::readOutput(toml::node const& node)
{
    toml::table const* const table = node.as_table();
    std::optional<std::string> const to = table == nullptr ? std::nullopt : (*table)["to"].value_exact<std::string>();
    if (!to) {
        m_table.mistake(node, "output.to", "is missing: where the output goes, such as \"csv:drive.csv\"");
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
                m_table.mistake(value, "output." + name, "must be a text or a whole number");
                continue;
            }
            addOption(address, name, number ? std::to_string(*number) : *text);
        }
        requirePlainTarget(address);
        m_settings.outputs.push_back(std::move(address));
    } catch (Error const& error) {
        m_table.mistake(*table, "output", error.what());
    }
}

void WatchSettingsReader::readOutputs(toml::node const& node, std::string const& key)
{
    toml::array const* const list = node.as_array();
    if (list == nullptr) {
        m_table.mistake(node, key, "must be written as [[output]]");
        return;
    }
    std::ranges::for_each(*list, [this](toml::node const& each) { readOutput(each); });
}

void WatchSettingsReader::readBattery(toml::node const& node, std::string const& key)
{
    toml::table const* const table = node.as_table();
    if (table == nullptr) {
        m_table.mistake(node, key, "must be a table: [battery]");
        return;
    }
    BatterySettings& battery = m_settings.battery;
    m_table.read(*table, key + ".",
                 {{"stop_after", m_table.duration(battery.stopAfter)},
                  {"settle", m_table.duration(battery.settle)},
                  {"voltage_every", m_table.duration(battery.voltageEvery)},
                  {"running_volts", m_table.volts(battery.runningVolts, lowestVolts)},
                  {"low_volts", m_table.volts(battery.lowVolts, lowestVolts)},
                  {"wake_change", m_table.volts(battery.wakeChange, 0.1)},
                  {"still_limit", m_table.duration(battery.stillLimit)},
                  {"electric", m_table.into(battery.electric, "true or false")},
                  {"adapter_sleep", m_table.into(battery.adapterSleep, "true or false")},
                  {"wake", by(&WatchSettingsReader::readWake)}});
    if (battery.adapterSleep && battery.wakeEvery) {
        m_table.mistake(*table, "battery.adapter_sleep", "a request would wake the adapter: choose this or wake");
    }
}

WatchSettings WatchSettingsReader::read(toml::table const& root)
{
    m_table.read(root, "",
                 {{"port", m_table.into(m_settings.port, "a text")},
                  {"vehicle", by(&WatchSettingsReader::readVehicle)},
                  {"vin", by(&WatchSettingsReader::readVin)},
                  {"fast", m_table.into(m_settings.fast, "true or false")},
                  {"codes_every", m_table.duration(m_settings.codesEvery)},
                  {"sensors", [this](toml::node const& node, std::string const&) { readSensors(node); }},
                  {"signals", by(&WatchSettingsReader::readSignals)},
                  {"output", by(&WatchSettingsReader::readOutputs)},
                  {"battery", by(&WatchSettingsReader::readBattery)}});
    return m_settings;
}

} // namespace

WatchSettings parseWatchSettings(std::string_view text, std::string const& name)
{
    WatchSettingsReader reader(name);
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
    constexpr std::uintmax_t largest = 1U << 20U;
    if (std::string const why = whyUnreadable(file, largest); !why.empty()) {
        throw Error(ErrorKind::WrongUse, "Could not read " + file + ": " + why,
                    {"the settings of the watch are a text in TOML"});
    }
    std::ifstream in(file, std::ios::binary);
    std::string const text{std::istreambuf_iterator<char>(in), {}};
    if (!in) {
        throw Error(ErrorKind::WrongUse, "Could not read " + file, {"does the file exist, and may you read it?"});
    }
    WatchSettings settings = parseWatchSettings(text, file);
    for (std::string& each : settings.signals) {
        each = (std::filesystem::path(file).parent_path() / each).string(); // an absolute one stays
    }
    return settings;
}

} // namespace velmora
