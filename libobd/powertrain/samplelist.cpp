#include "libobd/powertrain/samplelist.h"

namespace obd {

void SampleList::dropOlderThan(std::int32_t age, std::uint32_t now)
{
    while (!m_samples.empty() && elapsed(m_samples.front().time, now) > age) {
        m_samples.pop_front();
    }
}

double SampleList::mean() const
{
    if (m_samples.empty()) {
        return 0.0;
    }
    double sum = 0.0;
    for (Sample const& sample : m_samples) {
        sum += sample.value;
    }
    return sum / static_cast<double>(m_samples.size());
}

} // namespace obd
