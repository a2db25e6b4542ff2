#include "libvelmora/dash/playdesk.h"

#include <algorithm>
#include <chrono>
#include <map>
#include <vector>

namespace velmora {

PlayDesk::PlayDesk(Recording const& recording, double speed) : m_recording(recording), m_player(recording)
{
    m_player.setSpeed(speed);
}

void PlayDesk::introduce()
{
    DashVehicle vehicle{"recording", {}};
    for (RecordedSensor const& each : m_recording.sensors) {
        vehicle.offered.push_back(each.about);
    }
    m_desk->tell(vehicle);
}

Json PlayDesk::parse(Json const& wish)
{
    Json result = Json::object();
    if (wish.contains("paused") && wish["paused"].is_boolean()) {
        result["paused"] = wish["paused"];
    }
    for (char const* const key : {"speed", "position"}) {
        if (wish.contains(key) && wish[key].is_number()) {
            result[key] = wish[key];
        }
    }
    return result.empty() ? Json() : result;
}

// A jump shows the last value of each sensor before it, at once.
PlayDesk::Passed PlayDesk::obey(Json const& wish)
{
    std::lock_guard const lock(m_mutex);
    if (wish.contains("paused")) {
        m_player.setPaused(wish["paused"].get<bool>());
    }
    if (wish.contains("speed")) {
        m_player.setSpeed(wish["speed"].get<double>());
    }
    std::map<std::size_t, RecordedValue const*> last;
    if (wish.contains("position")) {
        double const wanted = std::clamp(wish["position"].get<double>(), static_cast<double>(m_recording.begin),
                                         static_cast<double>(m_recording.end));
        m_player.seek(static_cast<std::int64_t>(wanted),
                      [&last](std::size_t sensor, RecordedValue const& value) { last[sensor] = &value; });
    }
    return {last.begin(), last.end()};
}

// Nothing is told while the lock is held: whoever listens may ask for the state.
void PlayDesk::step(double seconds)
{
    Passed passed;
    while (auto const ask = m_desk->next()) {
        if (ask->topic == "play") {
            passed = obey(Json::parse(ask->text));
        } else if (ask->topic != "sensors") {
            m_desk->tell(DashAnswer{ask->topic, false, "A recording is played, which has no vehicle to ask"});
        }
    }
    {
        std::lock_guard const lock(m_mutex);
        m_player.advance(seconds, [&passed](std::size_t sensor, RecordedValue const& value) {
            passed.emplace_back(sensor, &value);
        });
    }
    for (auto const& [sensor, value] : passed) {
        tell(sensor, *value);
    }
}

void PlayDesk::tell(std::size_t sensor, RecordedValue const& value)
{
    RecordedSensor const& recorded = m_recording.sensors[sensor];
    Reading reading;
    reading.time = std::chrono::system_clock::now();
    reading.module = recorded.about.module;
    reading.sensor = recorded.about.sensor;
    reading.pid = recorded.about.pid;
    reading.name = recorded.about.name;
    reading.unit = recorded.about.unit;
    reading.precision = recorded.decimals;
    reading.value = value.value;
    m_desk->tell(reading);
}

Json PlayDesk::state() const
{
    std::lock_guard const lock(m_mutex);
    return {{"begin", m_recording.begin},
            {"end", m_recording.end},
            {"position", m_player.position()},
            {"speed", m_player.speed()},
            {"paused", m_player.isPaused()}};
}

} // namespace velmora
