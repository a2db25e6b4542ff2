#include "libvelmora/read/sensornames.h"
#include "libvelmora/text/text.h"

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
