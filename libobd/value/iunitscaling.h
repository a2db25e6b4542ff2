#pragma once

#include <obd/measurementunit.h>

#include <string>

namespace obd {

// How a raw 16 bit number of a test result becomes a value, and how a value is shown. Immutable.
class IUnitScaling
{
public:
    virtual ~IUnitScaling() = default;

    // raw: 0 to 65535.
    virtual double value(unsigned int raw) const = 0;

    // The value as a user sees it, without its unit.
    virtual std::string toString(double value) const = 0;

    // The unit of the text.
    virtual MeasurementUnit unit() const = 0;
};

} // namespace obd
