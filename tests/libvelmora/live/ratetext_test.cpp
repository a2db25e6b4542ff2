#include "libvelmora/live/ratetext.h"

#include <gtest/gtest.h>

namespace {

using velmora::missedRates;
using velmora::PollRate;
using velmora::reachedRates;

TEST(RateText, AskedAndReachedStandSideBySide)
{
    std::vector<PollRate> rates{{0x7E8, 0x0C, 10.0, 9.87, 0}, {0x7E8, 0x0D, {}, 33.0, 0}, {0x7E8, 0xC2, 5.0, 2.5, 0}};
    EXPECT_EQ(reachedRates(rates), "RPM 9.87 of 10 Hz, PID_C2 2.5 of 5 Hz");
    EXPECT_EQ(missedRates(rates), "PID_C2 2.5 of 5 Hz"); // nine tenths are near enough
    rates.push_back({0x7E9, 0x0C, 0.2, 0.2, 0});
    EXPECT_EQ(reachedRates(rates), "7E8 RPM 9.87 of 10 Hz, 7E8 PID_C2 2.5 of 5 Hz, 7E9 RPM 0.2 of 0.2 Hz");
    EXPECT_EQ(reachedRates({}), "");
    EXPECT_EQ(missedRates({{0x7E8, 0x0C, 10.0, 9.0, 0}}), "") << "just not missed";
    EXPECT_EQ(missedRates({{0x7E8, 0x0C, 10.0, 8.99, 0}}), "RPM 8.99 of 10 Hz");
}

} // namespace
