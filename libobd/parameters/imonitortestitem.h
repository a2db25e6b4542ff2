#pragma once

#include <obd/measurementunit.h>

#include <string>

namespace obd {

// One test result of an on-board monitor: a value with its limits, as texts in one unit. Immutable.
class IMonitorTestItem
{
public:
    enum Status : int
    {
        Passed = 0,
        Failed = 1,
        NoResult = 2, // the test has not run since the codes were cleared
    };

    virtual ~IMonitorTestItem() = default;

    virtual unsigned char testId() const = 0;
    virtual std::string description() const = 0;
    virtual std::string value() const = 0;
    virtual std::string minimum() const = 0; // empty if there is no lower limit
    virtual std::string maximum() const = 0; // empty if there is no upper limit
    virtual Status status() const = 0;
    virtual MeasurementUnit unit() const = 0;
};

} // namespace obd
