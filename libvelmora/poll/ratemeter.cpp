#include "libvelmora/poll/ratemeter.h"

namespace velmora {

void RateMeter::count(Time now)
{
    m_times.push_back(now);
    if (m_times.size() > most) {
        m_times.pop_front();
    }
}

double RateMeter::hertz(Time now) const
{
    if (m_times.size() < 2) {
        return 0.0;
    }
    using Seconds = std::chrono::duration<double>;
    auto const intervals = static_cast<double>(m_times.size() - 1);
    double const span = Seconds(m_times.back() - m_times.front()).count();
    double const silence = Seconds(now - m_times.back()).count();
    // One interval may be on its way; what is beyond it counts.
    double const usual = span / intervals;
    double const whole = silence > 2.0 * usual ? span + silence : span;
    return whole > 0.0 ? intervals / whole : 0.0;
}

} // namespace velmora
