#pragma once

#include <obd/export.h>

#include <string>

namespace obd {

/// How a number becomes text.
class IValueFormater
{
public:
    virtual ~IValueFormater() = default;

    virtual std::string toString(double value) const = 0; ///< without a unit
};

/// Writes numbers with a fixed count of decimals. A plain value: it stands inside every numeric sensor value, so it
/// does without the virtual table of IValueFormater.
class OBD_EXPORT TypedValueFormater
{
public:
    /// decimals: 0 to 9.
    explicit TypedValueFormater(int decimals);

    /// The value rounded half up, towards plus infinity, in fixed notation: 1.25 at one decimal is "1.3", -2.5 at none
    /// is "-2". Values that are not finite are written as a stream writes them.
    std::string toString(double value) const;

private:
    double fixPrecision(double value) const;

    int m_decimals;
    int m_scale;
};

} // namespace obd
