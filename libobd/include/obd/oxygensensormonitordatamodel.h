#pragma once

#include <obd/measurementunit.h>

#include <string>

namespace obd {

/// A test result of an oxygen sensor for the application, ready for display; a copy that keeps nothing of the library
/// alive.
struct OxygenSensorMonitorDataModel
{
    int tid{0};              ///< test identifier of service 05
    std::string description; // such as "Rich to lean sensor switch time (calculated)"
    std::string value;
    std::string minimum;
    std::string maximum;
    int status{0}; ///< 0: within the limits, 1: outside
    MeasurementUnit unit{UnitNone};
};

/// The tests 01 to 04 of service 05 are thresholds that the module works with, not results: they have no limits (SAE
/// J1979).
constexpr bool isConstantTest(int tid)
{
    return tid >= 0x01 && tid <= 0x04;
}

} // namespace obd
