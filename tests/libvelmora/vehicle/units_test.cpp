#include "libvelmora/vehicle/units.h"
#include "tests/support/memorysettings.h"

#include <velmora/settings.h>

#include <gtest/gtest.h>

namespace {

using namespace velmora;

TEST(Units, ImperialGallonsAreThoseOfConsumptionAlone)
{
    // 25 mpg of the US, 9.41 l/100 km, are 30.02 mpg of the United Kingdom.
    EXPECT_NEAR(inUnits(25.0, UnitConsumptionImperial, Units::ImperialUk), 30.02, 0.005);
    EXPECT_EQ(inUnits(25.0, UnitConsumptionImperial, Units::Imperial), 25.0);
    EXPECT_EQ(inUnits(25.0, UnitMilesPerHour, Units::ImperialUk), 25.0);
    EXPECT_STREQ(labelInUnits("mpg", UnitConsumptionImperial, Units::ImperialUk), "mpg (UK)");
    EXPECT_STREQ(labelInUnits("mpg", UnitConsumptionImperial, Units::Imperial), "mpg");
    EXPECT_STREQ(labelInUnits("mph", UnitMilesPerHour, Units::ImperialUk), "mph");
}

TEST(Units, AreThoseOfTheSettings)
{
    support::MemorySettings store;
    EXPECT_EQ(storedUnits(obd::UnitSystem::Imperial, store), Units::Imperial);
    store.setInt(settings::gallon, 1);
    EXPECT_EQ(storedUnits(obd::UnitSystem::Imperial, store), Units::ImperialUk);
    EXPECT_EQ(storedUnits(obd::UnitSystem::Metric, store), Units::Metric);
    store.setInt(settings::gallon, 7);
    EXPECT_EQ(storedUnits(obd::UnitSystem::Imperial, store), Units::Imperial);
    EXPECT_EQ(librarySystem(Units::ImperialUk), obd::UnitSystem::Imperial);
    EXPECT_EQ(librarySystem(Units::Metric), obd::UnitSystem::Metric);
}

} // namespace
