#pragma once

#include "libobd/value/iunitscaling.h"

namespace obd {

// A state: any number but 0 is "true".
class BoolScaling : public IUnitScaling
{
public:
    double value(unsigned int raw) const override { return raw; }
    std::string toString(double value) const override { return value != 0.0 ? "true" : "false"; }
    MeasurementUnit unit() const override { return UnitNone; }
};

// A number of which nothing is known: shown as it came.
class DummyScaling : public IUnitScaling
{
public:
    double value(unsigned int raw) const override { return raw; }
    std::string toString(double value) const override { return std::to_string(static_cast<unsigned int>(value)); }
    MeasurementUnit unit() const override { return UnitNone; }
};

} // namespace obd
