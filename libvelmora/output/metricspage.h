#pragma once

#include "libvelmora/output/health.h"
#include "libvelmora/output/record.h"

#include <chrono>
#include <map>
#include <string>
#include <tuple>

namespace velmora {

// The latest number of each sensor, and the page of it that a metrics collector reads. No thread safety of its own.
class MetricsPage
{
public:
    using SteadyTime = std::chrono::steady_clock::time_point;

    // Ages go by the steady clock: the other may be set.
    void take(Reading const& reading, SteadyTime now);
    // The text format, version 0.0.4. Values that are older than a minute have left the page.
    std::string render(SteadyTime now, Health const& health) const;

private:
    struct Sample
    {
        double value = 0.0;
        SteadyTime time;
    };
    using Series = std::tuple<std::string, unsigned int, std::string>; // vehicle, module, sensor

    struct Family
    {
        std::string help;
        std::map<Series, Sample> samples;
    };

    std::map<std::string, Family> m_families; // by name
};

} // namespace velmora
