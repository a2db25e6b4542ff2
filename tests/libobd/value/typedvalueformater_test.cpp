#include <obd/typedvalueformater.h>

#include <gtest/gtest.h>

#include <limits>

namespace {

struct Case
{
    int decimals;
    double value;
    char const* text;
};

TEST(TypedValueFormater, RoundsHalfUpAndWritesAllDecimals)
{
    Case const cases[] = {
        {1, 1.25, "1.3"},
        {1, 1.249, "1.2"},
        {1, -0.04, "0.0"},
        {1, -0.06, "-0.1"},
        {0, 5.0, "5"},
        {3, 0.1, "0.100"},
        {0, 2.5, "3"},
        {0, -2.5, "-2"},
        {0, -2.51, "-3"},
        {0, 0.0, "0"},
        {2, -1.005, "-1.00"},
        {2, 0.125, "0.13"},
        {1, 65535.0, "65535.0"},
        {1, 655350.0, "655350.0"},
        {0, 1e15, "1000000000000000"},
    };
    for (Case const& c : cases) {
        EXPECT_EQ(obd::TypedValueFormater(c.decimals).toString(c.value), c.text)
            << c.value << " with " << c.decimals << " decimals";
    }
}

TEST(TypedValueFormater, WritesWhatIsNotFiniteAsTheStreamDoes)
{
    EXPECT_EQ(obd::TypedValueFormater(1).toString(std::numeric_limits<double>::infinity()), "inf");
    EXPECT_EQ(obd::TypedValueFormater(1).toString(std::numeric_limits<double>::quiet_NaN()), "nan");
}

} // namespace
