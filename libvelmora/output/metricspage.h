#pragma once

#include "libvelmora/output/health.h"
#include "libvelmora/output/record.h"

#include <map>
#include <string>
#include <tuple>

namespace velmora {

// The latest number of each sensor, and the page of it that a metrics collector reads. No thread safety of its own.
class MetricsPage
{
public:
    void take(Reading const& reading);
    // The text format, version 0.0.4. Values that are older than a minute have left the page.
    std::string render(WallTime now, Health const& health) const;

private:
    struct Sample
    {
        double value = 0.0;
        WallTime time;
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
