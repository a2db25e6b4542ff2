#include <obd/parameterdescriptor.h>
#include <obd/sensorinfo.h>

#include <gtest/gtest.h>

namespace {

using obd::SensorInfo;
using obd::UnitSystem;

TEST(SensorInfo, KnowsTheParameterByTheUid)
{
    EXPECT_EQ(SensorInfo(120, "Engine RPM", true).pid(), 12);
    EXPECT_EQ(SensorInfo(125, "Engine RPM", true).pid(), 12);
}

TEST(SensorInfo, TellsWhatItWasBuiltWith)
{
    SensorInfo info(120, "Engine RPM", true);
    EXPECT_EQ(info.uid(), 120);
    EXPECT_EQ(info.description(), "Engine RPM");
    EXPECT_TRUE(info.isNumeric());
    EXPECT_FALSE(SensorInfo(280, "OBD standard", false).isNumeric());
}

TEST(SensorInfo, KeepsUnitAndRangeForEachUnitSystem)
{
    SensorInfo info(130, "Vehicle Speed Sensor", true);
    info.add(UnitSystem::Metric, UnitKmPerHour, 0.0, 255.0);
    info.add(UnitSystem::Imperial, UnitMilesPerHour, 1.0, 158.44935);
    EXPECT_EQ(info.unit(UnitSystem::Metric), UnitKmPerHour);
    EXPECT_EQ(info.maxValue(UnitSystem::Metric), 255.0);
    EXPECT_EQ(info.unit(UnitSystem::Imperial), UnitMilesPerHour);
    EXPECT_EQ(info.minValue(UnitSystem::Imperial), 1.0);
    EXPECT_EQ(info.maxValue(UnitSystem::Imperial), 158.44935);
}

TEST(SensorInfo, SecondAddForTheSameSystemReplacesTheFirst)
{
    SensorInfo info(130, "Vehicle Speed Sensor", true);
    info.add(UnitSystem::Metric, UnitKmPerHour, 0.0, 255.0);
    info.add(UnitSystem::Metric, UnitRpm, -1.0, 2.0);
    EXPECT_EQ(info.unit(UnitSystem::Metric), UnitRpm);
    EXPECT_EQ(info.minValue(UnitSystem::Metric), -1.0);
    EXPECT_EQ(info.maxValue(UnitSystem::Metric), 2.0);
}

TEST(SensorInfo, ReadsNothingForASystemOfWhichNothingWasSaid)
{
    SensorInfo info(130, "Vehicle Speed Sensor", true);
    info.add(UnitSystem::Metric, UnitKmPerHour, 1.0, 255.0);
    EXPECT_EQ(info.unit(UnitSystem::Imperial), UnitNone);
    EXPECT_EQ(info.minValue(UnitSystem::Imperial), 0.0);
    EXPECT_EQ(info.maxValue(UnitSystem::Imperial), 0.0);
}

TEST(SensorDescriptor, ForwardsToTheInfoInItsUnitSystem)
{
    auto const info = std::make_shared<SensorInfo>(130, "Vehicle Speed Sensor", true);
    info->add(UnitSystem::Metric, UnitKmPerHour, 0.0, 255.0);
    info->add(UnitSystem::Imperial, UnitMilesPerHour, 1.0, 158.44935);
    obd::SensorDescriptor const descriptor(info, UnitSystem::Imperial);
    EXPECT_EQ(descriptor.description(), "Vehicle Speed Sensor");
    EXPECT_TRUE(descriptor.isNumeric());
    EXPECT_EQ(descriptor.uid(), 130);
    EXPECT_EQ(descriptor.unit(), UnitMilesPerHour);
    EXPECT_EQ(descriptor.minValue(), 1.0);
    EXPECT_EQ(descriptor.maxValue(), 158.44935);
    EXPECT_EQ(obd::SensorDescriptor(info, UnitSystem::Metric).unit(), UnitKmPerHour);
}

} // namespace
