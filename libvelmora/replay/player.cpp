#include "libvelmora/replay/player.h"

#include <algorithm>

namespace velmora {

RecordingPlayer::RecordingPlayer(Recording const& recording)
    : m_recording(recording), m_position(static_cast<double>(recording.begin))
{
    for (std::uint32_t sensor = 0; sensor < recording.sensors.size(); ++sensor) {
        std::vector<RecordedValue> const& values = recording.sensors[sensor].values;
        for (std::uint32_t index = 0; index < values.size(); ++index) {
            m_order.push_back({values[index].time, sensor, index});
        }
    }
    std::ranges::stable_sort(m_order, {}, &Place::time);
}

void RecordingPlayer::give(Sink const& sink)
{
    for (; m_next < m_order.size() && m_order[m_next].time <= position(); ++m_next) {
        Place const& place = m_order[m_next];
        sink(place.sensor, m_recording.sensors[place.sensor].values[place.index]);
    }
}

void RecordingPlayer::advance(double seconds, Sink const& sink)
{
    if (!m_paused) {
        m_position = std::min(m_position + seconds * 1000.0 * m_speed, static_cast<double>(m_recording.end));
    }
    give(sink);
}

void RecordingPlayer::seek(std::int64_t time, Sink const& sink)
{
    m_position = static_cast<double>(std::clamp(time, m_recording.begin, m_recording.end));
    m_next = 0;
    give(sink);
}

void RecordingPlayer::setSpeed(double speed)
{
    m_speed = std::clamp(speed, slowest, fastest);
}

} // namespace velmora
