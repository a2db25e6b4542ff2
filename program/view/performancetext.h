#pragma once

#include "libvelmora/performance/performancemeter.h"
#include "program/view/framestyle.h"

#include <string>

namespace velmora::cli {

// What a timed run has come to.
struct PerformanceView
{
    PerformanceMeter const& meter;
    bool imperial = false;
    int kilograms = 0; // that power is reckoned with
    std::string note;  // in the place of the keys
};

// The speed in big digits, the times of the goals with their errors, and power and torque by engine speed.
std::string drawPerformance(PerformanceView const& view, FrameStyle const& style);

} // namespace velmora::cli
