#pragma once

#include <string>

namespace obd {

/// A counter of in-use monitor performance for the application; a copy that keeps nothing of the library alive.
class PerformanceCounterDataModel
{
public:
    PerformanceCounterDataModel(std::string const& counterDescription, unsigned int counterValue)
        : description(counterDescription), value(buildValue(counterValue))
    {}

    std::string description; // such as "Ignition Cycle Counter"
    std::string value;       ///< decimal digits, without separators in any locale

private:
    static std::string buildValue(unsigned int number) { return std::to_string(number); }
};

} // namespace obd
