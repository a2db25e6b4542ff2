#include "libvelmora/report/document/limitbar.h"

#include <gtest/gtest.h>

#include <regex>

namespace {

using namespace velmora;

// The figures of a bar: where its range begins, how wide that is, and where the needle stands.
TEST(LimitBar, StandsWithItsLimitsAtAFifthAndFourFifths)
{
    struct Case
    {
        std::optional<double> min;
        std::optional<double> max;
        double value;
        char const* figures;
    };
    Case const cases[] = {
        {1.0, 4.0, 2.5, "20.0 60.0 48.5 needle"},
        {1.0, 4.0, 1.0, "20.0 60.0 18.5 needle"},
        {1.0, 4.0, 4.0, "20.0 60.0 78.5 needle"},
        {1.0, 4.0, 4.1, "20.0 60.0 80.5 needle out"},
        {1.0, 4.0, 0.9, "20.0 60.0 16.5 needle out"},
        {1.0, 4.0, 99.0, "20.0 60.0 97.0 needle out"},
        {1.0, 4.0, -99.0, "20.0 60.0 0.0 needle out"},
        {std::nullopt, 3.0, 1.5, "0.0 75.0 36.0 needle"},
        {std::nullopt, -3.0, -3.0, "0.0 0.5 0.0 needle"},
        {3.0, std::nullopt, 3.0, "25.0 75.0 23.5 needle"},
        {-3.0, std::nullopt, -3.0, "14.3 85.7 12.8 needle"},
        {2.0, 2.0, 2.0, "50.0 0.5 48.5 needle"},
    };
    for (Case const& each : cases) {
        std::string const drawn = drawnBar(LimitBar{each.value, each.min, each.max});
        static std::regex const pattern("class=\"track\"/><rect x=\"([^\"]*)\" y=\"4\" width=\"([^\"]*)\".*"
                                        "<rect x=\"([^\"]*)\" y=\"0\".*class=\"(needle[^\"]*)\"");
        std::smatch match;
        ASSERT_TRUE(std::regex_search(drawn, match, pattern)) << drawn;
        std::string const figures = match.str(1) + " " + match.str(2) + " " + match.str(3) + " " + match.str(4);
        EXPECT_EQ(figures, each.figures) << each.value;
    }
    EXPECT_EQ(drawnBar(LimitBar{1.0, {}, {}}), "");
}

} // namespace
