#pragma once

#include <obd/measurementunit.h>

#include <string>

namespace obd {

/// A test result of an on-board monitor for the application, ready for display; a copy that keeps nothing of the
/// library alive.
struct DiagnosticTestDataModel
{
    enum class Status : int
    {
        NoResult = 0, ///< the test has not run since the codes were cleared
        Failed = 1,
        Passed = 2,
    };

    DiagnosticTestDataModel(int id, std::string const& testDescription, std::string const& testValue,
                            std::string const& lowerLimit, std::string const& upperLimit,
                            MeasurementUnit measurementUnit, Status testStatus)
        : testId(id), description(testDescription), value(testValue), minimum(lowerLimit), maximum(upperLimit),
          unit(measurementUnit), status(testStatus)
    {}

    int testId; ///< test identifier of service 06
    std::string description;
    std::string value;
    std::string minimum; ///< empty if there is no lower limit
    std::string maximum; ///< empty if there is no upper limit
    MeasurementUnit unit;
    Status status;
};

} // namespace obd
