#include <velmora/recording.h>

#include <algorithm>

namespace velmora {

struct RecordingPlayer::Parts
{
    struct Place
    {
        std::int64_t time;
        std::uint32_t sensor;
        std::uint32_t index;
    };

    explicit Parts(Recording const& played);

    void give(Sink const& sink);

    Recording const& recording;
    std::vector<Place> order; // of all values, by time
    std::size_t next = 0;
    double position;
    double speed = 1.0;
    bool paused = false;
};

RecordingPlayer::Parts::Parts(Recording const& played) : recording(played), position(static_cast<double>(played.begin))
{
    for (std::uint32_t sensor = 0; sensor < played.sensors.size(); ++sensor) {
        std::vector<RecordedValue> const& values = played.sensors[sensor].values;
        for (std::uint32_t index = 0; index < values.size(); ++index) {
            order.push_back({values[index].time, sensor, index});
        }
    }
    std::ranges::stable_sort(order, {}, &Place::time);
}

void RecordingPlayer::Parts::give(Sink const& sink)
{
    auto const now = static_cast<std::int64_t>(position);
    for (; next < order.size() && order[next].time <= now; ++next) {
        Place const& place = order[next];
        sink(place.sensor, recording.sensors[place.sensor].values[place.index]);
    }
}

RecordingPlayer::RecordingPlayer(Recording const& recording) : m_parts(std::make_unique<Parts>(recording)) {}

RecordingPlayer::~RecordingPlayer() = default;

void RecordingPlayer::advance(double seconds, Sink const& sink)
{
    if (!m_parts->paused) {
        m_parts->position = std::min(m_parts->position + seconds * 1000.0 * m_parts->speed,
                                     static_cast<double>(m_parts->recording.end));
    }
    m_parts->give(sink);
}

void RecordingPlayer::seek(std::int64_t time, Sink const& sink)
{
    m_parts->position = static_cast<double>(std::clamp(time, m_parts->recording.begin, m_parts->recording.end));
    m_parts->next = 0;
    m_parts->give(sink);
}

void RecordingPlayer::setPaused(bool paused)
{
    m_parts->paused = paused;
}

bool RecordingPlayer::isPaused() const
{
    return m_parts->paused;
}

void RecordingPlayer::setSpeed(double speed)
{
    m_parts->speed = std::clamp(speed, slowest, fastest);
}

double RecordingPlayer::speed() const
{
    return m_parts->speed;
}

std::int64_t RecordingPlayer::position() const
{
    return static_cast<std::int64_t>(m_parts->position);
}

bool RecordingPlayer::atEnd() const
{
    return m_parts->next == m_parts->order.size() && position() >= m_parts->recording.end;
}

} // namespace velmora
