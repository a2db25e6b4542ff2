#include <obd/typedvalueformater.h>

#include <gtest/gtest.h>

#include <cmath>
#include <iomanip>
#include <limits>
#include <locale>
#include <random>
#include <sstream>

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

std::string streamed(double value, int decimals)
{
    double const scale = std::pow(10.0, decimals);
    std::ostringstream text;
    text << std::fixed << std::setprecision(decimals) << std::floor(scale * value + 0.5) / scale;
    return text.str();
}

TEST(TypedValueFormater, WritesWhatAStreamWrites)
{
    std::mt19937 random(7);
    std::uniform_real_distribution<double> mantissa(-10.0, 10.0);
    for (int i = 0; i < 5000; ++i) {
        int const decimals = i % 10;
        double const value = mantissa(random) * std::pow(10.0, i / 10 % 20 - 4);
        EXPECT_EQ(obd::TypedValueFormater(decimals).toString(value), streamed(value, decimals)) << value;
    }
    for (double const value : {-0.0, 1e300, -1e300, 1e-300, 11258999068426.235, 11258999068426.245}) {
        EXPECT_EQ(obd::TypedValueFormater(2).toString(value), streamed(value, 2)) << value;
    }
}

struct CommaAndGroups : std::numpunct<char>
{
    char do_decimal_point() const override { return ','; }
    char do_thousands_sep() const override { return '.'; }
    std::string do_grouping() const override { return "\3"; }
};

TEST(TypedValueFormater, WritesAsTheApplicationsLocaleHasIt)
{
    std::locale const before = std::locale::global(std::locale(std::locale::classic(), new CommaAndGroups));
    std::string const text = obd::TypedValueFormater(2).toString(-1234.5);
    std::locale::global(before);
    EXPECT_EQ(text, "-1.234,50");
}

} // namespace
