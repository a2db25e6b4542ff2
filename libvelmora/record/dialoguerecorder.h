#pragma once

#include "simulator/dialogue.h"

#include <chrono>
#include <cstddef>
#include <mutex>
#include <string>
#include <string_view>
#include <vector>

namespace velmora {

// Records what passes a port as a dialogue, byte for byte and with its pauses, up to a megabyte of each reply. Any
// thread.
class DialogueRecorder
{
public:
    void onSent(std::string_view bytes);
    void onReceived(std::string_view bytes);

    // What was said so far. What vehicle and adapter were is the caller's to tell.
    obdsim::Dialogue dialogue() const;
    // What was sent behind the first so many lines.
    std::vector<std::string> sentFrom(std::size_t first) const;

private:
    using Clock = std::chrono::steady_clock;

    obdsim::Time pauseUntil(Clock::time_point now);

    mutable std::mutex m_mutex;
    obdsim::Dialogue m_dialogue; // protected by m_mutex, as what follows
    std::string m_line;          // sent so far, its end is still to come
    std::size_t m_room = 0;      // for further bytes of the reply under way; none before the first command
    Clock::time_point m_told;    // how far the pauses that were written reach
};

} // namespace velmora
