#pragma once

#include "libvelmora/output/record.h"

#include <nlohmann/json.hpp>

#include <string>
#include <utility>
#include <vector>

namespace velmora {

// How Home Assistant learns of a vehicle over MQTT.
struct HomeAssistantPlace
{
    std::string vehicle;
    std::string statusTopic; // "online" or "offline"
    std::string stateTopic;  // the object that stateKey names the members of
};

enum class Discovery
{
    Off,
    Device, // one message for the device, as of Home Assistant 2024.11
    Entity, // one for each sensor, for all versions
};

// The member of the state object that holds a sensor: "7e8_rpm".
std::string stateKey(unsigned int module, std::string const& sensor);

// Topics and payloads to publish, retained.
std::vector<std::pair<std::string, std::string>> discoveryMessages(Discovery discovery, HomeAssistantPlace const& place,
                                                                   std::vector<SensorEntry> const& sensors);

} // namespace velmora
