#pragma once

#include "libobd/value/iunitscaling.h"

#include <obd/typedvalueformater.h>

namespace obd {

// A factor and a fixed count of decimals. A conversion to another unit works on the text only, so that values and their
// limits are compared as the module sent them.
class LinearScaling : public IUnitScaling
{
public:
    using Conversion = double (*)(double);

    // id: its top bit says that raw numbers are signed (SAE J1979: the identifiers from 0x80 up). conversion: may be
    // null.
    LinearScaling(signed char id, double factor, int decimals, MeasurementUnit unit, Conversion conversion = nullptr);

    double value(unsigned int raw) const override;
    std::string toString(double value) const override;
    MeasurementUnit unit() const override { return m_unit; }

private:
    signed char m_id;
    double m_factor;
    TypedValueFormater m_formater;
    MeasurementUnit m_unit;
    Conversion m_conversion;
};

// The same with an offset that is added to the value.
class LinearOffsetScaling : public LinearScaling
{
public:
    LinearOffsetScaling(signed char id, double factor, float offset, int decimals, MeasurementUnit unit,
                        Conversion conversion = nullptr);

    double value(unsigned int raw) const override;

private:
    float m_offset;
};

} // namespace obd
