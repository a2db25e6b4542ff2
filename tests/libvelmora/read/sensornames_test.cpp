#include "common/text/text.h"
#include "libvelmora/read/sensornames.h"

#include <gtest/gtest.h>

#include <set>

namespace {

using namespace velmora;

TEST(SensorNames, RiseByPidAndStandOnce)
{
    std::set<std::string> names;
    int previous = 0;
    for (SensorName const& each : sensorNames()) {
        EXPECT_GE(each.pid, previous) << each.name;
        EXPECT_TRUE(names.insert(each.name).second) << each.name;
        EXPECT_EQ(toUpper(each.name), each.name);
        previous = each.pid;
    }
}

// What people have in their scripts from python-OBD, as its documentation lists it.
TEST(SensorNames, UnderstandsThoseOfPythonObd)
{
    static constexpr SensorName known[] = {
        {0x00, "PIDS_A"},
        {0x01, "STATUS"},
        {0x02, "FREEZE_DTC"},
        {0x03, "FUEL_STATUS"},
        {0x04, "ENGINE_LOAD"},
        {0x05, "COOLANT_TEMP"},
        {0x06, "SHORT_FUEL_TRIM_1"},
        {0x07, "LONG_FUEL_TRIM_1"},
        {0x08, "SHORT_FUEL_TRIM_2"},
        {0x09, "LONG_FUEL_TRIM_2"},
        {0x0A, "FUEL_PRESSURE"},
        {0x0B, "INTAKE_PRESSURE"},
        {0x0C, "RPM"},
        {0x0D, "SPEED"},
        {0x0E, "TIMING_ADVANCE"},
        {0x0F, "INTAKE_TEMP"},
        {0x10, "MAF"},
        {0x11, "THROTTLE_POS"},
        {0x12, "AIR_STATUS"},
        {0x13, "O2_SENSORS"},
        {0x14, "O2_B1S1"},
        {0x15, "O2_B1S2"},
        {0x16, "O2_B1S3"},
        {0x17, "O2_B1S4"},
        {0x18, "O2_B2S1"},
        {0x19, "O2_B2S2"},
        {0x1A, "O2_B2S3"},
        {0x1B, "O2_B2S4"},
        {0x1C, "OBD_COMPLIANCE"},
        {0x1D, "O2_SENSORS_ALT"},
        {0x1E, "AUX_INPUT_STATUS"},
        {0x1F, "RUN_TIME"},
        {0x20, "PIDS_B"},
        {0x21, "DISTANCE_W_MIL"},
        {0x22, "FUEL_RAIL_PRESSURE_VAC"},
        {0x23, "FUEL_RAIL_PRESSURE_DIRECT"},
        {0x24, "O2_S1_WR_VOLTAGE"},
        {0x25, "O2_S2_WR_VOLTAGE"},
        {0x26, "O2_S3_WR_VOLTAGE"},
        {0x27, "O2_S4_WR_VOLTAGE"},
        {0x28, "O2_S5_WR_VOLTAGE"},
        {0x29, "O2_S6_WR_VOLTAGE"},
        {0x2A, "O2_S7_WR_VOLTAGE"},
        {0x2B, "O2_S8_WR_VOLTAGE"},
        {0x2C, "COMMANDED_EGR"},
        {0x2D, "EGR_ERROR"},
        {0x2E, "EVAPORATIVE_PURGE"},
        {0x2F, "FUEL_LEVEL"},
        {0x30, "WARMUPS_SINCE_DTC_CLEAR"},
        {0x31, "DISTANCE_SINCE_DTC_CLEAR"},
        {0x32, "EVAP_VAPOR_PRESSURE"},
        {0x33, "BAROMETRIC_PRESSURE"},
        {0x34, "O2_S1_WR_CURRENT"},
        {0x35, "O2_S2_WR_CURRENT"},
        {0x36, "O2_S3_WR_CURRENT"},
        {0x37, "O2_S4_WR_CURRENT"},
        {0x38, "O2_S5_WR_CURRENT"},
        {0x39, "O2_S6_WR_CURRENT"},
        {0x3A, "O2_S7_WR_CURRENT"},
        {0x3B, "O2_S8_WR_CURRENT"},
        {0x3C, "CATALYST_TEMP_B1S1"},
        {0x3D, "CATALYST_TEMP_B2S1"},
        {0x3E, "CATALYST_TEMP_B1S2"},
        {0x3F, "CATALYST_TEMP_B2S2"},
        {0x40, "PIDS_C"},
        {0x41, "STATUS_DRIVE_CYCLE"},
        {0x42, "CONTROL_MODULE_VOLTAGE"},
        {0x43, "ABSOLUTE_LOAD"},
        {0x44, "COMMANDED_EQUIV_RATIO"},
        {0x45, "RELATIVE_THROTTLE_POS"},
        {0x46, "AMBIANT_AIR_TEMP"},
        {0x47, "THROTTLE_POS_B"},
        {0x48, "THROTTLE_POS_C"},
        {0x49, "ACCELERATOR_POS_D"},
        {0x4A, "ACCELERATOR_POS_E"},
        {0x4B, "ACCELERATOR_POS_F"},
        {0x4C, "THROTTLE_ACTUATOR"},
        {0x4D, "RUN_TIME_MIL"},
        {0x4E, "TIME_SINCE_DTC_CLEARED"},
        {0x4F, "MAX_VALUES"},
        {0x50, "MAX_MAF"},
        {0x51, "FUEL_TYPE"},
        {0x52, "ETHANOL_PERCENT"},
        {0x53, "EVAP_VAPOR_PRESSURE_ABS"},
        {0x54, "EVAP_VAPOR_PRESSURE_ALT"},
        {0x55, "SHORT_O2_TRIM_B1"},
        {0x56, "LONG_O2_TRIM_B1"},
        {0x57, "SHORT_O2_TRIM_B2"},
        {0x58, "LONG_O2_TRIM_B2"},
        {0x59, "FUEL_RAIL_PRESSURE_ABS"},
        {0x5A, "RELATIVE_ACCEL_POS"},
        {0x5B, "HYBRID_BATTERY_REMAINING"},
        {0x5C, "OIL_TEMP"},
        {0x5D, "FUEL_INJECT_TIMING"},
        {0x5E, "FUEL_RATE"},
        {0x5F, "EMISSION_REQ"},
    };
    static_assert(std::size(known) == 96);
    for (SensorName const& each : known) {
        EXPECT_EQ(findSensorName(each.name), each.pid) << each.name;
    }
}

TEST(SensorNames, KeepsItsKeysBesideAliases)
{
    EXPECT_EQ(sensorKey(0x24), "PID_24");
    EXPECT_EQ(sensorKey(0x46), "AMBIENT_TEMP");
    for (SensorName const& each : sensorAliases()) {
        EXPECT_NE(sensorNameOf(each.pid), each.name);
    }
}

TEST(SensorNames, AreNotTakenForPids)
{
    for (SensorName const& each : sensorNames()) {
        std::string const name = each.name;
        EXPECT_TRUE(name.size() > 2 || name.find_first_not_of("0123456789ABCDEF") != std::string::npos) << name;
    }
}

TEST(SensorNames, FindsBothWays)
{
    EXPECT_EQ(findSensorName("iat"), 0x0F);
    EXPECT_EQ(findSensorName("nonsense"), std::nullopt);
    EXPECT_EQ(sensorNameOf(0x05), "COOLANT_TEMP");
    EXPECT_EQ(sensorNameOf(0x20), "");
}

TEST(Text, FitsInColumnsOfCharactersNotBytes)
{
    EXPECT_EQ(displayWidth("°C"), 2U);
    EXPECT_EQ(fitted("°C", 4), "°C  ");
    EXPECT_EQ(fitted("12", 4, true), "  12");
    EXPECT_EQ(fitted("Temperature", 5), "Temp…");
    EXPECT_EQ(fitted("µµµ", 2), "µ…");
    EXPECT_EQ(fitted("abc", 0), "");
    EXPECT_EQ(fitted("abc", 3), "abc");
}

TEST(Text, SplitsAtBlanksUnderscoresAndDashes)
{
    EXPECT_EQ(splitWords(" air_temp  a-b "), (std::vector<std::string>{"air", "temp", "a", "b"}));
    EXPECT_TRUE(splitWords(" - ").empty());
}

TEST(Text, CountsTheEditsBetweenTexts)
{
    EXPECT_EQ(editDistance("RPM", "RPM"), 0U);
    EXPECT_EQ(editDistance("RMP", "RPM"), 2U);
    EXPECT_EQ(editDistance("SPED", "SPEED"), 1U);
    EXPECT_EQ(editDistance("", "ABC"), 3U);
    EXPECT_EQ(editDistance("KITTEN", "SITTING"), 3U);
}

} // namespace
