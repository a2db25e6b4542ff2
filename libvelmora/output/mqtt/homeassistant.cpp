#include "libvelmora/output/mqtt/homeassistant.h"

#include "libvelmora/output/valuetext.h"

#include <velmora/version.h>

#include <algorithm>
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

nlohmann::ordered_json device(HomeAssistantPlace const& place)
{
    return {{"identifiers", {"velmora_" + place.vehicle}}, {"name", place.vehicle}, {"sw_version", versionText}};
}

nlohmann::ordered_json component(HomeAssistantPlace const& place, SensorEntry const& sensor)
{
    std::string const key = stateKey(sensor.module, sensor.sensor);
    nlohmann::ordered_json entity = {{"platform", "sensor"},
                                     {"unique_id", "velmora_" + place.vehicle + "_" + key},
                                     {"name", sensor.name + " (" + moduleText(sensor.module) + ")"},
                                     {"state_topic", place.stateTopic},
                                     {"value_template", "{{ value_json['" + key + "'] }}"}};
    if (!sensor.unit.empty()) {
        auto const* const row = std::ranges::find(unitRows, sensor.unit, &UnitRow::ours);
        bool const known = row != std::end(unitRows);
        if (!known || row->theirs != nullptr) {
            entity["unit_of_measurement"] = known ? row->theirs : sensor.unit;
        }
        entity["state_class"] = isCounter(sensor) ? "total_increasing" : "measurement";
        if (known && row->deviceClass != nullptr) {
            entity["device_class"] = sensor.pid == barometer ? "atmospheric_pressure" : row->deviceClass;
        }
    }
    return entity;
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

std::vector<std::pair<std::string, std::string>> discoveryMessages(Discovery discovery, HomeAssistantPlace const& place,
                                                                   std::vector<SensorEntry> const& sensors)
{
    std::vector<std::pair<std::string, std::string>> messages;
    nlohmann::ordered_json const origin = {{"name", "velmora"}, {"sw_version", versionText}};
    nlohmann::ordered_json components;
    for (SensorEntry const& each : sensors) {
        std::string const key = stateKey(each.module, each.sensor);
        nlohmann::ordered_json entity = component(place, each);
        components[key] = entity;
        if (discovery == Discovery::Entity) {
            entity.erase("platform");
            entity["availability_topic"] = place.statusTopic;
            entity["device"] = device(place);
            entity["origin"] = origin;
            messages.emplace_back("homeassistant/sensor/velmora_" + place.vehicle + "/" + key + "/config",
                                  entity.dump());
        }
    }
    if (discovery == Discovery::Device && !components.empty()) {
        nlohmann::ordered_json const config = {{"device", device(place)},
                                               {"origin", origin},
                                               {"availability_topic", place.statusTopic},
                                               {"qos", 1},
                                               {"components", components}};
        messages.emplace_back("homeassistant/device/velmora_" + place.vehicle + "/config", config.dump());
    }
    return messages;
}

} // namespace velmora
