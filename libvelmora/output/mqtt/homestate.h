#pragma once

#include "libvelmora/output/mqtt/homeassistant.h"

#include <chrono>
#include <functional>
#include <map>

namespace velmora {

// What a home server is told of a car beside the stream of readings: the latest values as one object, once a second at
// most; events as they come; how to read both.
class HomeState
{
public:
    using Time = std::chrono::steady_clock::time_point;
    // Not taken, and lost, without a connection.
    using Publish = std::function<void(std::string const& topic, std::string const& payload, bool retain)>;

    HomeState(Discovery discovery, HomeAssistantPlace place, Publish publish);

    void take(Record const& record, Time now);
    // If there is something new. Call it while there is a connection.
    void publishState(Time now);
    void publishDiscovery() const;

private:
    struct Live
    {
        std::chrono::seconds expiry{};
        Time time;
    };

    void takeReading(Reading const& reading, Time now);
    void takeList(SensorList const& list);
    void takeLamp(LampState const& lamp);
    void publishEvent(Event const& event) const;
    void forgetOld(Time now);

    Discovery const m_discovery;
    HomeAssistantPlace const m_place;
    Publish const m_publish;
    std::vector<SensorEntry> m_sensors;
    std::map<std::string, Live> m_live; // by key: those that expire
    std::map<unsigned int, bool> m_lamps;
    nlohmann::ordered_json m_state;
    bool m_changed = false;
    Time m_published;
};

} // namespace velmora
