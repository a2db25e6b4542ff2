#pragma once

#include "libvelmora/replay/recording.h"

#include <cstddef>
#include <cstdint>
#include <functional>
#include <vector>

namespace velmora {

// Plays a recording: gives its values as time goes on, at a speed, with pauses and jumps. One thread.
class RecordingPlayer
{
public:
    static constexpr double slowest = 0.125;
    static constexpr double fastest = 64.0;

    // Of the sensor with that number in the recording.
    using Sink = std::function<void(std::size_t sensor, RecordedValue const& value)>;

    // The recording must outlive it.
    explicit RecordingPlayer(Recording const& recording);

    // Goes on by so many seconds of the player's time; does nothing while paused. sink gets what is passed, in the
    // order of time; the first values at once.
    void advance(double seconds, Sink const& sink);
    // Goes to a time, forward or back: sink gets all values from the beginning up to there.
    void seek(std::int64_t time, Sink const& sink);

    void setPaused(bool paused) { m_paused = paused; }
    bool isPaused() const { return m_paused; }
    // Within slowest and fastest.
    void setSpeed(double speed);
    double speed() const { return m_speed; }

    std::int64_t position() const { return static_cast<std::int64_t>(m_position); } // ms since 1970
    bool atEnd() const { return m_next == m_order.size() && position() >= m_recording.end; }

private:
    struct Place
    {
        std::int64_t time;
        std::uint32_t sensor;
        std::uint32_t index;
    };

    void give(Sink const& sink);

    Recording const& m_recording;
    std::vector<Place> m_order; // of all values, by time
    std::size_t m_next = 0;
    double m_position = 0.0;
    double m_speed = 1.0;
    bool m_paused = false;
};

} // namespace velmora
