#include "libvelmora/output/mqtt/homestate.h"

#include "libvelmora/output/recordjson.h"
#include "libvelmora/output/valuetext.h"

#include <algorithm>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds statePause{1000};
constexpr char const* unknownState = "None";

} // namespace

HomeState::HomeState(Discovery discovery, HomeAssistantPlace place, Publish publish)
    : m_discovery(discovery), m_place(std::move(place)), m_publish(std::move(publish))
{}

void HomeState::take(Record const& record, Time now)
{
    if (auto const* const reading = std::get_if<Reading>(&record)) {
        takeReading(*reading, now);
    } else if (auto const* const list = std::get_if<SensorList>(&record)) {
        takeList(*list);
    } else if (auto const* const lamp = std::get_if<LampState>(&record)) {
        takeLamp(*lamp);
    } else if (auto const* const event = std::get_if<Event>(&record)) {
        publishEvent(*event);
    }
}

void HomeState::takeReading(Reading const& reading, Time now)
{
    std::string const key = stateKey(reading.module, reading.sensor);
    nlohmann::ordered_json value = valueJson(reading);
    m_state[key] = value.is_null() ? nlohmann::ordered_json(unknownState) : std::move(value);
    if (auto const live = m_live.find(key); live != m_live.end()) {
        live->second.time = now;
    }
    m_changed = true;
}

void HomeState::takeList(SensorList const& list)
{
    m_sensors = list.sensors;
    std::map<std::string, Live> const before = std::exchange(m_live, {});
    for (SensorEntry const& each : m_sensors) {
        if (std::optional<int> const expiry = expirySeconds(each)) {
            std::string const key = stateKey(each.module, each.sensor);
            auto const known = before.find(key);
            m_live[key] = {std::chrono::seconds(*expiry), known == before.end() ? Time() : known->second.time};
        }
    }
    publishDiscovery();
}

void HomeState::takeLamp(LampState const& lamp)
{
    m_lamps[lamp.module] = lamp.on;
    bool const on = std::ranges::any_of(m_lamps, [](auto const& each) { return each.second; });
    m_state[lampKey] = on ? "ON" : "OFF";
    m_changed = true;
}

// Never retained: a home server would take an old one for new after its own restart.
void HomeState::publishEvent(Event const& event) const
{
    if (m_discovery != Discovery::Off) {
        nlohmann::ordered_json payload = {{"event_type", event.kind}};
        payload.update(toJsonValue(event));
        payload.erase("event");
        m_publish(m_place.eventTopic, toLine(payload), false);
    }
}

// One sensor that has fallen silent while others go on would look alive: each message renews all that it holds.
void HomeState::forgetOld(Time now)
{
    for (auto const& [key, live] : m_live) {
        if (m_state.contains(key) && now - live.time > live.expiry) {
            m_state[key] = unknownState;
        }
    }
}

void HomeState::publishState(Time now)
{
    // A little less than a second: writes come once a second, give or take.
    if (m_changed && now - m_published >= statePause - statePause / 10) {
        m_changed = false;
        m_published = now;
        forgetOld(now);
        m_publish(m_place.stateTopic, toLine(m_state), true);
    }
}

void HomeState::publishDiscovery() const
{
    for (auto const& [topic, payload] : discoveryMessages(m_discovery, m_place, m_sensors)) {
        m_publish(topic, payload, true);
    }
}

} // namespace velmora
