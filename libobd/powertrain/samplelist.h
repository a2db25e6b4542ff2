#pragma once

#include "libobd/powertrain/sample.h"

#include <cstddef>
#include <deque>

namespace obd {

// Samples over which a value is smoothed, oldest first.
class SampleList
{
public:
    void add(Sample const& sample) { m_samples.push_back(sample); }
    std::size_t size() const { return m_samples.size(); }

    void dropOldest() { m_samples.pop_front(); }

    // Drops samples from the oldest on, as long as they are older than that many milliseconds.
    void dropOlderThan(std::int32_t age, std::uint32_t now);

    // 0.0 if there are none.
    double mean() const;

private:
    std::deque<Sample> m_samples;
};

} // namespace obd
