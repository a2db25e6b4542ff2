#include "tests/support/fakeclock.h"

#include <common/cdatetime.h>
#include <common/localtime.h>

#include <gtest/gtest.h>

namespace {

using obd::CDateTime;

TEST(CDateTime, ZeroIsTheEpochShiftedByTheLocalZone)
{
    std::tm const local = tervex::toLocalTime(0);
    CDateTime const time(0);
    EXPECT_EQ(time.year(), static_cast<unsigned int>(local.tm_year + 1900));
    EXPECT_EQ(time.month(), static_cast<unsigned int>(local.tm_mon + 1));
    EXPECT_EQ(time.day(), static_cast<unsigned int>(local.tm_mday));
    EXPECT_EQ(time.hour(), static_cast<unsigned int>(local.tm_hour));
    EXPECT_EQ(time.minute(), static_cast<unsigned int>(local.tm_min));
    EXPECT_EQ(time.second(), static_cast<unsigned int>(local.tm_sec));
}

TEST(CDateTime, NegativeSecondsLieBeforeTheEpoch)
{
    EXPECT_EQ(CDateTime(-86400 * 365).year(), 1969U);
}

TEST(CDateTime, StoresSixValuesUnchecked)
{
    CDateTime const time(1, 13, 32, 25, 61, 99);
    EXPECT_EQ(time.year(), 1U);
    EXPECT_EQ(time.month(), 13U);
    EXPECT_EQ(time.day(), 32U);
    EXPECT_EQ(time.hour(), 25U);
    EXPECT_EQ(time.minute(), 61U);
    EXPECT_EQ(time.second(), 99U);
}

TEST(CDateTime, TextPadsAllButTheYear)
{
    EXPECT_EQ(CDateTime(2024, 3, 7, 9, 5, 2).toString(), "2024-03-07 09:05:02");
    EXPECT_EQ(CDateTime(987, 12, 31, 23, 59, 58).toString(), "987-12-31 23:59:58");
}

TEST(CDateTime, SecondsRoundTripInWinter)
{
    CDateTime const time(2024, 1, 15, 12, 30, 15);
    EXPECT_EQ(CDateTime(static_cast<int>(time.toSeconds())).toString(), time.toString());
}

TEST(CDateTime, YearBefore1970GivesZeroSeconds)
{
    EXPECT_EQ(CDateTime(1960, 5, 5, 5, 5, 5).toSeconds(), 0U);
}

TEST(CDateTime, CurrentTimeComesFromTheClock)
{
    support::FakeClock clock(0, 1709802302);
    EXPECT_EQ(CDateTime::currentDateTime().toString(), CDateTime(1709802302).toString());
}

TEST(Clock, CountsMillisecondsAndSleeps)
{
    unsigned int const before = obd::currentMillis();
    obd::sleepMillis(2);
    EXPECT_GE(obd::currentMillis() - before, 2U);
}

TEST(Clock, DifferencesSurviveTheWrap)
{
    support::FakeClock clock(0xFFFFFFF0U);
    unsigned int const before = obd::currentMillis();
    obd::sleepMillis(0x20);
    EXPECT_EQ(obd::currentMillis(), 0x10U);
    EXPECT_EQ(obd::currentMillis() - before, 0x20U);
}

} // namespace
