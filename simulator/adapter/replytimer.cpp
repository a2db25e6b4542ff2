#include "simulator/adapter/replytimer.h"

#include <algorithm>

namespace obdsim {

ReplyTimer::ReplyTimer(AdapterTiming const& timing) : m_timing(timing) {}

/// ELM327 data sheet v2.1, page 52: replies at 4 and 58 ms make ATAT1 wait "in the range of 90 ms", which is 1.5 times
/// the slowest; ATAT2 is "more aggressive", for which we take 1.2. ATST is the most that either waits (page 25).
Time ReplyTimer::wait(Settings const& settings) const
{
    if (m_timing.wait) {
        return *m_timing.wait;
    }
    if (settings.adaptiveTiming == 0 || !m_slowest) {
        return settings.timeout();
    }
    Time const adapted = settings.adaptiveTiming == 1 ? *m_slowest * 3 / 2 : *m_slowest * 6 / 5;
    return std::min(adapted, settings.timeout());
}

Time ReplyTimer::waitForRest(Settings const& settings) const
{
    return m_timing.wait.value_or(settings.timeout());
}

void ReplyTimer::learn(Time reply)
{
    m_slowest = std::max(reply, m_slowest.value_or(Time(0)));
}

void ReplyTimer::forget()
{
    m_slowest.reset();
}

} // namespace obdsim
