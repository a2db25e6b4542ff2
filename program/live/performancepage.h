#pragma once

#include "program/view/framestyle.h"

#include <velmora/performance.h>

#include <memory>
#include <string>

namespace velmora::cli {

// Timed runs of one vehicle while its speed and engine speed alone are read.
class PerformancePage
{
public:
    // module: whose readings count. settings must outlive it.
    PerformancePage(std::shared_ptr<obd::IEcu> module, obd::IVelmoraSettings const& settings);

    void take(Reading const& reading) { m_timer.take(reading); }
    std::string draw(std::string const& note, FrameStyle const& style) const;
    // Writes the run to a file of the user's, and tells which.
    std::string save() const;

private:
    bool isImperial() const;

    obd::IVelmoraSettings const& m_settings;
    PerformanceTimer m_timer;
};

} // namespace velmora::cli
