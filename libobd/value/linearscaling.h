#pragma once

#include <obd/measurementunit.h>
#include <obd/typedvalueformater.h>

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
