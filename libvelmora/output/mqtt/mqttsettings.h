#pragma once

#include "libvelmora/output/mqtt/homeassistant.h"
#include "libvelmora/output/outputaddress.h"
#include "libvelmora/output/outputcontext.h"

#include <string>

namespace velmora {

// Where and how an MQTT output sends.
struct MqttSettings
{
    std::string host;
    int port = 1883;
    std::string topic; // with the vehicle: "cars/van"
    bool tls = false;
    std::string ca; // file; empty: those of the system
    int qos = 1;
    std::string user;
    std::string password;
    std::string ackTopic; // empty: the broker's word is enough
    std::string spool;
    unsigned long long spoolMax = 0;
    Discovery discovery = Discovery::Device;
    HomeAssistantPlace place;
};

// Reads user and password from the files that are named, else from VELMORA_MQTT_USER and VELMORA_MQTT_PASSWORD. Throws
// Error.
MqttSettings mqttSettings(OutputAddress const& address, OutputContext const& context);

// What a consumer reports as stored: {"spool": "0123456789abcdef", "seq": 17}. Nothing for any other text or spool.
std::optional<std::int64_t> storedMark(std::string const& payload, std::string const& spool);

} // namespace velmora
