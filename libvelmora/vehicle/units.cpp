#include "libvelmora/vehicle/units.h"

#include <velmora/settings.h>

namespace velmora {

namespace {

// In litres, both exact by definition.
constexpr double imperialGallon = 4.54609;
constexpr double usGallon = 3.785411784;

bool isShownOtherwise(MeasurementUnit unit, Units units)
{
    return units == Units::ImperialUk && unit == UnitConsumptionImperial;
}

} // namespace

Units storedUnits(obd::UnitSystem system, obd::ISettings& store)
{
    int gallon = 0;
    store.getInt(settings::gallon, gallon);
    if (system == obd::UnitSystem::Metric) {
        return Units::Metric;
    }
    return gallon == 1 ? Units::ImperialUk : Units::Imperial;
}

double inUnits(double number, MeasurementUnit unit, Units units)
{
    return isShownOtherwise(unit, units) ? number * (imperialGallon / usGallon) : number;
}

char const* labelInUnits(char const* label, MeasurementUnit unit, Units units)
{
    return isShownOtherwise(unit, units) ? "mpg (UK)" : label;
}

} // namespace velmora
