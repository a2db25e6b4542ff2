#include "libvelmora/output/mqtt/homeassistant.h"

#include "libvelmora/output/eventkinds.h"
#include "libvelmora/output/valuetext.h"

#include <velmora/version.h>

#include <algorithm>
#include <cmath>
#include <iterator>
#include <string_view>

namespace velmora {

namespace {

// A class that does not know the unit gives no statistics, so those without a fitting one have none.
struct UnitRow
{
    std::string_view ours;
    char const* theirs;      // null for none
    char const* deviceClass; // null for none
};

constexpr UnitRow unitRows[] = {
    {"km/h", "km/h", "speed"},
    {"mph", "mph", "speed"},
    {"°C", "°C", "temperature"},
    {"°F", "°F", "temperature"},
    {"kPa", "kPa", "pressure"},
    {"Pa", "Pa", "pressure"},
    {"psi", "psi", "pressure"},
    {"inHg", "inHg", "pressure"},
    {"V", "V", "voltage"},
    {"A", "A", "current"},
    {"mA", "mA", "current"},
    {"s", "s", "duration"},
    {"min", "min", "duration"},
    {"km", "km", "distance"},
    {"mi", "mi", "distance"},
    {"Hz", "Hz", "frequency"},
    {"MHz", "MHz", "frequency"},
    {"kW", "kW", "power"},
    {"l/h", "L/h", "volume_flow_rate"},
    {"l", "L", "volume_storage"},
    {"l/100 km", "L/100km", nullptr},
    {"lambda", nullptr, nullptr},
};

constexpr std::string_view barometer = "0133";

// What only rises until it begins anew: a statistic of differences then, not of means.
bool isCounter(SensorEntry const& sensor)
{
    constexpr std::string_view runTime = "011F"; // since the engine's start
    return sensor.unit == "km" || sensor.unit == "mi" || sensor.pid == runTime;
}

// What a module tells of the tank and of the traction battery.
bool isLevel(SensorEntry const& sensor)
{
    return sensor.pid == "012F" || sensor.pid == "015B";
}

nlohmann::ordered_json device(HomeAssistantPlace const& place)
{
    return {{"identifiers", {"velmora_" + place.vehicle}}, {"name", place.vehicle}, {"sw_version", versionText}};
}

nlohmann::ordered_json entity(HomeAssistantPlace const& place, std::string const& platform, std::string const& key,
                              std::string const& name)
{
    return {{"platform", platform}, {"unique_id", "velmora_" + place.vehicle + "_" + key}, {"name", name}};
}

nlohmann::ordered_json sensorEntity(HomeAssistantPlace const& place, SensorEntry const& sensor)
{
    std::string const key = stateKey(sensor.module, sensor.sensor);
    nlohmann::ordered_json result = entity(place, "sensor", key, sensor.name + " (" + moduleText(sensor.module) + ")");
    result["state_topic"] = place.stateTopic;
    result["value_template"] = "{{ value_json['" + key + "'] }}";
    if (std::optional<int> const expiry = expirySeconds(sensor)) {
        result["expire_after"] = *expiry;
    }
    if (!sensor.unit.empty()) {
        auto const* const row = std::ranges::find(unitRows, sensor.unit, &UnitRow::ours);
        bool const known = row != std::end(unitRows);
        if (!known || row->theirs != nullptr) {
            result["unit_of_measurement"] = known ? row->theirs : sensor.unit;
        }
        result["state_class"] = isCounter(sensor) ? "total_increasing" : "measurement";
        if (known && row->deviceClass != nullptr) {
            result["device_class"] = sensor.pid == barometer ? "atmospheric_pressure" : row->deviceClass;
        }
    }
    return result;
}

nlohmann::ordered_json lampEntity(HomeAssistantPlace const& place)
{
    nlohmann::ordered_json result = entity(place, "binary_sensor", lampKey, "Malfunction lamp");
    result["state_topic"] = place.stateTopic;
    result["value_template"] = std::string("{{ value_json['") + lampKey + "'] }}";
    result["device_class"] = "problem";
    return result;
}

nlohmann::ordered_json eventEntity(HomeAssistantPlace const& place)
{
    nlohmann::ordered_json result = entity(place, "event", "event", "Last event");
    result["state_topic"] = place.eventTopic;
    result["event_types"] = eventKinds;
    return result;
}

// By their keys.
nlohmann::ordered_json entities(HomeAssistantPlace const& place, std::vector<SensorEntry> const& sensors)
{
    nlohmann::ordered_json result;
    for (SensorEntry const& each : sensors) {
        result[stateKey(each.module, each.sensor)] = sensorEntity(place, each);
    }
    result[lampKey] = lampEntity(place);
    result["event"] = eventEntity(place);
    return result;
}

} // namespace

std::string stateKey(unsigned int module, std::string const& sensor)
{
    std::string key = moduleText(module) + "_" + sensor;
    std::ranges::transform(key, key.begin(), [](char each) {
        bool const capital = each >= 'A' && each <= 'Z';
        bool const plain = (each >= 'a' && each <= 'z') || (each >= '0' && each <= '9');
        return capital ? static_cast<char>(each - 'A' + 'a') : plain ? each : '_';
    });
    return key;
}

std::optional<int> expirySeconds(SensorEntry const& sensor)
{
    constexpr double periods = 3.0;
    constexpr double shortest = 60.0;
    if (isCounter(sensor) || isLevel(sensor)) {
        return std::nullopt;
    }
    double const seconds = sensor.hertz > 0.0 ? std::ceil(periods / sensor.hertz) : shortest;
    return static_cast<int>(std::clamp(seconds, shortest, 1e6));
}

std::vector<std::pair<std::string, std::string>> discoveryMessages(Discovery discovery, HomeAssistantPlace const& place,
                                                                   std::vector<SensorEntry> const& sensors)
{
    std::vector<std::pair<std::string, std::string>> messages;
    if (discovery == Discovery::Off || sensors.empty()) {
        return messages;
    }
    nlohmann::ordered_json const origin = {{"name", "velmora"}, {"sw_version", versionText}};
    nlohmann::ordered_json const all = entities(place, sensors);
    if (discovery == Discovery::Device) {
        nlohmann::ordered_json const config = {{"device", device(place)},
                                               {"origin", origin},
                                               {"availability_topic", place.statusTopic},
                                               {"qos", 1},
                                               {"components", all}};
        messages.emplace_back("homeassistant/device/velmora_" + place.vehicle + "/config", config.dump());
        return messages;
    }
    for (auto const& [key, component] : all.items()) {
        nlohmann::ordered_json single = component;
        std::string const platform = single["platform"];
        single.erase("platform");
        single["availability_topic"] = place.statusTopic;
        single["device"] = device(place);
        single["origin"] = origin;
        messages.emplace_back("homeassistant/" + platform + "/velmora_" + place.vehicle + "/" + key + "/config",
                              single.dump());
    }
    return messages;
}

} // namespace velmora
