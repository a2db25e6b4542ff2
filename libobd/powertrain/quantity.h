#pragma once

#include <obd/iecu.h>
#include <obd/measurementunit.h>
#include <obd/sensorinfo.h>
#include <obd/sensorvalue.h>
#include <obd/unitsystem.h>

#include <memory>
#include <string>

namespace obd {

// The form in which a number reaches the user. The whole ones are cut toward zero after conversion.
enum class NumberForm : unsigned char
{
    Int,
    Unsigned,
    Double,
    Digits, // an unsigned number published as a text of its digits: it has no statistics
};

// How a quantity is shown in one unit system.
struct Scale
{
    MeasurementUnit unit{UnitNone};
    NumberForm form{NumberForm::Double};
    int decimals{0};
};

// What a sensor measures. Numbers are kept in the metric unit; the imperial ones, of the range too, follow from them.
struct Quantity
{
    double minimum{0.0};
    double maximum{0.0};
    Scale metric;
    Scale imperial;
    double (*toImperial)(double){nullptr}; // null where both systems use one unit
    double (*maximumOf)(IEcu const&){
        nullptr}; // where the module's configuration sets the upper end, in place of maximum
    std::string (*stateText)(unsigned){nullptr}; // for a coded state: the text that stands for its number

    constexpr Scale const& scale(UnitSystem system) const { return system == UnitSystem::Imperial ? imperial : metric; }
    constexpr bool isNumeric() const { return stateText == nullptr && metric.form != NumberForm::Digits; }
};

// A quantity with the same unit in both systems.
constexpr Quantity sameInBoth(double minimum, double maximum, Scale scale)
{
    return {minimum, maximum, scale, scale};
}

// A stored metric number in a unit system, cut where the system shows whole numbers.
double convert(Quantity const& quantity, double metric, UnitSystem system);

// A number that convert() gave, as a reading.
std::shared_ptr<SensorValue> makeValue(int uid, Quantity const& quantity, double converted, UnitSystem system);

std::shared_ptr<SensorInfo const> makeInfo(int uid, std::string const& name, Quantity const& quantity, double maximum);

} // namespace obd
