#pragma once

#include <obd/isettings.h>
#include <obd/measurementunit.h>
#include <obd/unitsystem.h>
#include <velmora/units.h>

namespace velmora {

// The system that the library has to work in. Its imperial one has gallons of the US; those of the United Kingdom are
// the companion's.
constexpr obd::UnitSystem librarySystem(Units units)
{
    return units == Units::Metric ? obd::UnitSystem::Metric : obd::UnitSystem::Imperial;
}

// What a store of settings says, where the library's system is that.
Units storedUnits(obd::UnitSystem system, obd::ISettings& store);

// What people are shown of the library's number in that unit: another one for consumption in gallons of the United
// Kingdom alone.
double inUnits(double number, MeasurementUnit unit, Units units);

// The label of that unit, which tells the gallons apart: "mpg (UK)".
char const* labelInUnits(char const* label, MeasurementUnit unit, Units units);

} // namespace velmora
