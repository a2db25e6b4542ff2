#pragma once

#include "libvelmora/output/record.h"

#include <nlohmann/json.hpp>

#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace velmora {

// How Home Assistant learns of a vehicle over MQTT.
struct HomeAssistantPlace
{
    std::string vehicle;
    std::string statusTopic; // "online" or "offline"
    std::string stateTopic;  // the object that stateKey names the members of, and lampKey
    std::string eventTopic;  // objects with event_type
};

enum class Discovery
{
    Off,
    Device, // one message for the device, as of Home Assistant 2024.11
    Entity, // one for each sensor, for all versions
};

// The member of the state object that holds a sensor: "7e8_rpm".
std::string stateKey(unsigned int module, std::string const& sensor);

// The member that tells whether any lamp is on: "ON" or "OFF".
inline constexpr char const* lampKey = "lamp";

// After how many seconds without a new value the last one counts no longer; nothing for what stays as it is in a parked
// car: odometer, fuel, charge.
std::optional<int> expirySeconds(SensorEntry const& sensor);

// Topics and payloads to publish, retained: the sensors, the lamp, and events.
std::vector<std::pair<std::string, std::string>> discoveryMessages(Discovery discovery, HomeAssistantPlace const& place,
                                                                   std::vector<SensorEntry> const& sensors);

} // namespace velmora
