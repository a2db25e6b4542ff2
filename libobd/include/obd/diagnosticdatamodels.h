#pragma once

#include <obd/measurementunit.h>

#include <memory>
#include <string>
#include <vector>

namespace obd {

/// A test result of an on-board monitor for the application, ready for display; a copy that keeps nothing of the
/// library alive.
struct DiagnosticTestDataModel
{
    /// How the test has ended.
    enum class Status : int
    {
        NoResult = 0, ///< the test has not run since the codes were cleared
        Failed = 1,
        Passed = 2,
    };

    /// Fills all members.
    DiagnosticTestDataModel(int id, std::string const& testDescription, std::string const& testValue,
                            std::string const& lowerLimit, std::string const& upperLimit,
                            MeasurementUnit measurementUnit, Status testStatus)
        : testId(id), description(testDescription), value(testValue), minimum(lowerLimit), maximum(upperLimit),
          unit(measurementUnit), status(testStatus)
    {}

    int testId;              ///< test identifier of service 06
    std::string description; ///< what was tested
    std::string value;       ///< the result, without its unit
    std::string minimum;     ///< empty if there is no lower limit
    std::string maximum;     ///< empty if there is no upper limit
    MeasurementUnit unit;    ///< of value and limits
    Status status;           ///< by value and limits
};

/// An on-board monitor with its test results for the application; a copy that keeps nothing of the library alive.
struct DiagnosticMonitorDataModel
{
    /// Fills all members.
    DiagnosticMonitorDataModel(int monitorId, std::string const& monitorDescription,
                               std::vector<std::shared_ptr<DiagnosticTestDataModel>> const& monitorTests)
        : id(monitorId), description(monitorDescription), tests(monitorTests)
    {}

    int id;                  ///< monitor identifier of service 06 on CAN, component number on the legacy buses
    std::string description; ///< what is monitored
    std::vector<std::shared_ptr<DiagnosticTestDataModel>> tests; ///< in the order of the reply
};

/// A test result of an oxygen sensor for the application, ready for display; a copy that keeps nothing of the library
/// alive.
struct OxygenSensorMonitorDataModel
{
    int tid{0};                     ///< test identifier of service 05
    std::string description;        ///< such as "Rich to lean sensor switch time (calculated)"
    std::string value;              ///< the result, without its unit
    std::string minimum;            ///< empty if there is no lower limit
    std::string maximum;            ///< empty if there is no upper limit
    int status{0};                  ///< 0: within the limits, 1: outside
    MeasurementUnit unit{UnitNone}; ///< of value and limits
};

/// The tests 01 to 04 of service 05 are thresholds that the module works with, not results: they have no limits (SAE
/// J1979).
constexpr bool isConstantTest(int tid)
{
    return tid >= 0x01 && tid <= 0x04;
}

/// A counter of in-use monitor performance for the application; a copy that keeps nothing of the library alive.
class PerformanceCounterDataModel
{
public:
    /// Writes the number as text.
    PerformanceCounterDataModel(std::string const& counterDescription, unsigned int counterValue)
        : description(counterDescription), value(buildValue(counterValue))
    {}

    std::string description; ///< such as "Ignition Cycle Counter"
    std::string value;       ///< decimal digits, without separators in any locale

private:
    static std::string buildValue(unsigned int number) { return std::to_string(number); }
};

/// A readiness monitor for the application; a copy that keeps nothing of the library alive.
struct ReadinessMonitorDataModel
{
    /// How far the monitor has come.
    enum Status : int
    {
        Complete = 0,
        NotComplete = 1,
        DisabledThisCycle = 2, ///< of readiness in the present driving cycle only
        NotAvailable = 3,      ///< the vehicle has no such monitor
    };

    /// Fills both members.
    ReadinessMonitorDataModel(std::string const& monitorDescription, Status monitorStatus)
        : description(monitorDescription), status(monitorStatus)
    {}

    std::string description; ///< such as "Catalyst"
    Status status;           ///< since the codes were cleared, or of the present driving cycle, as was asked
};

} // namespace obd
