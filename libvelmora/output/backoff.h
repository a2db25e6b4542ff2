#pragma once

#include <algorithm>
#include <chrono>
#include <random>

namespace velmora {

// Pauses between attempts: 1 s, then twice as long each time up to 60 s, each shortened by up to a half at random, so
// that many cars don't come back at the same moment.
class Backoff
{
public:
    explicit Backoff(unsigned int seed) : m_random(seed) {}

    std::chrono::milliseconds next()
    {
        std::chrono::milliseconds const whole = m_pause;
        m_pause = std::min(2 * m_pause, longest);
        std::uniform_int_distribution<long> spread(whole.count() / 2, whole.count());
        return std::max(shortest, std::chrono::milliseconds(spread(m_random)));
    }
    // After a success.
    void reset() { m_pause = shortest; }

private:
    static constexpr std::chrono::milliseconds shortest{1000};
    static constexpr std::chrono::milliseconds longest{60000};

    std::minstd_rand m_random;
    std::chrono::milliseconds m_pause = shortest;
};

} // namespace velmora
