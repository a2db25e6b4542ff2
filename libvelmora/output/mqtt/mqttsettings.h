#pragma once

#include "libvelmora/output/mqtt/homeassistant.h"
#include "libvelmora/output/outputaddress.h"
#include "libvelmora/output/outputcontext.h"

#include <chrono>
#include <string>
#include <vector>

namespace velmora {

struct BrokerPlace
{
    std::string host;
    int port = 1883;
};

// Where and how an MQTT output sends.
struct MqttSettings
{
    std::vector<BrokerPlace> brokers; // one, or the nodes of a cluster: any of them will do
    std::string topic;                // with the vehicle: "cars/van"
    bool tls = false;
    std::string ca; // file; empty: those of the system
    int qos = 1;
    std::chrono::seconds keepAlive{30}; // so long without a word from the broker, twice, and the connection is given up
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
