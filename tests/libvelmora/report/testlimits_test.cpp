// The limits of on-board tests as numbers: which limit something, and which are only the end of what can be counted.
#include "libvelmora/report/document/moduletables.h"
#include "libvelmora/report/finding/testlimits.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {

using namespace velmora;

LimitTest boundTest(std::string const& value, std::string const& min, std::string const& max,
                    LimitTest::Verdict verdict = LimitTest::Verdict::Passed)
{
    return {0x80, "Test", value, min, max, "V", verdict};
}

// "1..5", with nothing for a limit that is none; "none" where there are no limits.
std::string boundsOf(LimitTest const& test)
{
    auto const limits = limitsOf(test);
    auto const text = [](std::optional<double> const& limit) {
        return limit ? std::to_string(std::lround(*limit)) : std::string();
    };
    return limits ? text(limits->min) + ".." + text(limits->max) : "none";
}

TEST(TestLimits, AreNoneWithoutAResultAValueOrSense)
{
    EXPECT_EQ(boundsOf(boundTest("2", "1", "5")), "1..5");
    EXPECT_EQ(boundsOf(boundTest("9", "1", "5", LimitTest::Verdict::Failed)), "1..5");
    EXPECT_EQ(boundsOf(boundTest("2", "1", "5", LimitTest::Verdict::NoResult)), "none");
    EXPECT_EQ(boundsOf(boundTest("2", "1", "5", LimitTest::Verdict::None)), "none");
    EXPECT_EQ(boundsOf(boundTest("", "1", "5")), "none");
    EXPECT_EQ(boundsOf(boundTest("2", "", "")), "none");
    EXPECT_EQ(boundsOf(boundTest("2", "5", "1")), "none") << "a minimum above the maximum";
    EXPECT_EQ(boundsOf(boundTest("3", "3", "3")), "3..3");
    EXPECT_EQ(boundsOf(boundTest("5", "0", "0", LimitTest::Verdict::Failed)), "..0") << "what must not be at all";
    EXPECT_EQ(limitsOf(boundTest("2.5", "1", "5"))->value, 2.5);
}

// SAE J1979, appendix E: a test with one limit sends the end of the range for the other.
TEST(TestLimits, LimitNothingAtTheEndOfTheRange)
{
    for (char const* const end :
         {"65535",     "6553.5",    "655.35",    "65.535",    "32767",     "327.67",    "3276.7",
          "16383.75",  "32767.5",   "3276.75",   "655350",    "40721.56",  "117963",    "9505.04",
          "6513.5",    "6513.4",    "11756.3",   "1.99997",   "2",         "4",         "20",
          "6.5535",    "16.38375",  "766.7595",  "5177.265",  "255.99609", "15.999756", "100",
          "199.99695", "50.799225", "144.47994", "62115.186", "48336.135", "2580.1181", "17312.515"}) {
        EXPECT_EQ(boundsOf(boundTest("2", "1", end)), "1..") << end;
    }
    EXPECT_FALSE(limitsOf(boundTest("0.7", "0.5", "0.99997"))->max);
    for (char const* const end : {"0", "-1", "-2", "-10", "-32768", "-327.68", "-3276.8", "-8192", "-40", "-58982.4",
                                  "-16384", "-1638.4", "-163.84", "-1.6384", "-4"}) {
        EXPECT_EQ(boundsOf(boundTest("2", end, "7")), "..7") << end;
    }
    for (char const* const limit : {"65533", "65537", "6513.0", "6514.0", "11755.0", "12000", "32000"}) {
        EXPECT_EQ(boundsOf(boundTest("2", "1", limit)), "1.." + std::to_string(std::lround(std::stod(limit))));
    }
    for (char const* const limit : {"-3", "-32700", "-41", "-39", "3"}) {
        EXPECT_EQ(boundsOf(boundTest("2", limit, "7")), std::string(limit) + "..7");
    }
}

TEST(TestLimits, AreCloseWithinATenthAndNotAtThem)
{
    EXPECT_EQ(closenessOf(boundTest("9", "", "10")), Closeness::NearMaximum) << "just a tenth away";
    EXPECT_EQ(closenessOf(boundTest("8.9", "", "10")), Closeness::Far);
    EXPECT_EQ(closenessOf(boundTest("11", "10", "")), Closeness::NearMinimum);
    EXPECT_EQ(closenessOf(boundTest("11.1", "10", "")), Closeness::Far);
    EXPECT_EQ(closenessOf(boundTest("10", "10", "")), Closeness::Far);
    EXPECT_EQ(closenessOf(boundTest("-8.2", "-9", "")), Closeness::NearMinimum);
    EXPECT_EQ(closenessOf(boundTest("-9.5", "", "-9")), Closeness::NearMaximum);
    EXPECT_EQ(closenessOf(boundTest("12", "11", "21")), Closeness::NearMinimum) << "of the span between both";
    EXPECT_EQ(closenessOf(boundTest("20", "11", "21")), Closeness::NearMaximum);
    EXPECT_EQ(closenessOf(boundTest("12.5", "11", "21")), Closeness::Far);
    EXPECT_EQ(closenessOf(boundTest("9", "", "10", LimitTest::Verdict::Failed)), Closeness::Far);
    EXPECT_EQ(closenessOf(boundTest("", "", "10")), Closeness::Far);
}

TEST(TestLimits, HaveNoBarWhereBothAreOne)
{
    auto const hasBar = [](LimitTest const& test) { return testTable("", {test}).rows[0][2].bar.has_value(); };
    EXPECT_TRUE(hasBar(boundTest("2", "1", "5")));
    EXPECT_TRUE(hasBar(boundTest("2", "1", "")));
    EXPECT_TRUE(hasBar(boundTest("2", "", "5")));
    EXPECT_FALSE(hasBar(boundTest("3", "3", "3")));
    EXPECT_FALSE(hasBar(boundTest("2", "", "")));
    EXPECT_TRUE(hasBar(boundTest("5", "0", "0", LimitTest::Verdict::Failed)));
    EXPECT_EQ(testTable("", {}).heads[1].text, "Test");
    EXPECT_EQ(testTable("Catalyst", {}).heads[1].text, "Catalyst");
}

// SAE J1979-DA: the monitor identifiers of service 06, and the readiness monitors of service 01 PID 01.
TEST(TestLimits, BelongToTheReadinessMonitorOfTheirKind)
{
    struct Range
    {
        int first;
        int last;
        char const* petrol;
        char const* diesel;
    };
    Range const ranges[] = {
        {0x01, 0x1F, "Oxygen Sensor", "Exhaust Gas Sensor"},
        {0x20, 0x20, "", ""},
        {0x21, 0x24, "Catalyst", "NMHC Catalyst"},
        {0x25, 0x30, "", ""},
        {0x31, 0x38, "EGR and/or VVT System", "EGR and/or VVT System"},
        {0x39, 0x3D, "Evaporative System", ""},
        {0x3E, 0x40, "", ""},
        {0x41, 0x5F, "Oxygen Sensor Heater", "Exhaust Gas Sensor"},
        {0x60, 0x60, "", ""},
        {0x61, 0x64, "Heated Catalyst", ""},
        {0x65, 0x70, "", ""},
        {0x71, 0x74, "Secondary Air System", ""},
        {0x75, 0x80, "", ""},
        {0x81, 0x84, "Fuel System", "Fuel System"},
        {0x85, 0x86, "", "Boost Pressure"},
        {0x87, 0x8F, "", ""},
        {0x90, 0x99, "", "NOx Aftertreatment"},
        {0x9A, 0xA0, "", ""},
        {0xA1, 0xB1, "Misfire", "Misfire"},
        {0xB2, 0xB3, "Gasoline Particulate Filter", "PM filter"},
        {0xB4, 0xFF, "", ""},
    };
    auto const nameOfMonitor = [](int monitor, bool diesel) {
        char const* const name = readinessNameOf(monitor, diesel);
        return name != nullptr ? std::string(name) : std::string();
    };
    EXPECT_EQ(nameOfMonitor(0, false), "");
    for (Range const& range : ranges) {
        for (int const monitor : {range.first, range.last}) {
            EXPECT_EQ(nameOfMonitor(monitor, false), range.petrol) << monitor;
            EXPECT_EQ(nameOfMonitor(monitor, true), range.diesel) << monitor;
        }
    }
}

} // namespace
