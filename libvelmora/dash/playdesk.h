#pragma once

#include "libvelmora/dash/dashdesk.h"

#include <velmora/recording.h>

#include <memory>
#include <mutex>
#include <utility>
#include <vector>

namespace velmora {

// Plays a recording to the page as if its readings came now, and does what the page asks of the player. The values of a
// paused recording grow old as any others. One thread, but for state.
class PlayDesk
{
public:
    // The recording must outlive it.
    PlayDesk(Recording const& recording, double speed);

    std::shared_ptr<DashDesk> const& desk() const { return m_desk; }
    // Tells who is there to be shown.
    void introduce();
    // Goes on by so many seconds, after what the page wants.
    void step(double seconds);
    // {"begin", "end", "position", "speed", "paused"}; times in ms since 1970. Any thread.
    Json state() const;

    // What a browser may want, with nothing else in it; null for all else.
    static Json parse(Json const& wish);

private:
    using Passed = std::vector<std::pair<std::size_t, RecordedValue const*>>; // sensors with values to be told

    Passed obey(Json const& wish);
    void tell(std::size_t sensor, RecordedValue const& value);

    Recording const& m_recording;
    std::shared_ptr<DashDesk> const m_desk = std::make_shared<DashDesk>();
    mutable std::mutex m_mutex;
    RecordingPlayer m_player; // protected by m_mutex
};

} // namespace velmora
