#include "libvelmora/output/clockjudge.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <chrono>
#include <fstream>
#include <sys/timex.h>

namespace {

using velmora::ClockJudge;

TEST(ClockJudge, TellsAWrongClockByItsWay)
{
    std::int64_t const sane = testsupport::march;
    ClockJudge fresh; // a machine without a clock battery
    EXPECT_EQ(fresh.look({1000, 10000, false, ""}), 0);
    EXPECT_EQ(fresh.trust(), ClockJudge::Trust::Wait);
    EXPECT_EQ(fresh.look({3000, 11000, false, ""}), 0); // a second is slewed, not set
    EXPECT_EQ(fresh.look({sane, 12000, false, ""}), sane - 12000 - (3000 - 11000));
    EXPECT_EQ(fresh.trust(), ClockJudge::Trust::Wait); // set, but by whom?
    fresh.look({sane + 1, 12001, true, ""});
    EXPECT_EQ(fresh.trust(), ClockJudge::Trust::Sure);

    ClockJudge alone; // no time server ever
    alone.look({sane, 299999, false, ""});
    EXPECT_EQ(alone.trust(), ClockJudge::Trust::Wait);
    alone.look({sane + 1, 300000, false, ""});
    EXPECT_EQ(alone.trust(), ClockJudge::Trust::Sure);

    ClockJudge kept; // a laptop, far from any network
    kept.look({sane, 1000, false, "", true});
    EXPECT_EQ(kept.trust(), ClockJudge::Trust::Sure);
    ClockJudge empty; // its battery has gone flat
    empty.look({1000000, 1000, false, "", true});
    EXPECT_EQ(empty.trust(), ClockJudge::Trust::Wait);

    ClockJudge lost;
    lost.look({1000000, 300000, false, ""});
    EXPECT_EQ(lost.trust(), ClockJudge::Trust::Never);
}

TEST(ClockJudge, HasExactBounds)
{
    std::int64_t const year2025 = 1735689600000;
    ClockJudge early;
    early.look({year2025 - 1, 300000, false, ""});
    EXPECT_EQ(early.trust(), ClockJudge::Trust::Never) << "this program is younger";
    ClockJudge right;
    right.look({year2025, 300000, false, ""});
    EXPECT_EQ(right.trust(), ClockJudge::Trust::Sure);
    ClockJudge set;
    set.look({year2025, 299000, false, ""});
    EXPECT_EQ(set.look({year2025 + 2999, 300000, false, ""}), 0);
    EXPECT_EQ(set.trust(), ClockJudge::Trust::Sure) << "not set since the start";
    EXPECT_EQ(set.look({year2025 + 5999, 301000, false, ""}), 2000);
    EXPECT_EQ(set.trust(), ClockJudge::Trust::Wait);
    EXPECT_EQ(set.look({year2025 + 5000, 302001, false, ""}), -2000) << "by the clock of the look before";
    set.look({year2025 + 5000 + 299999, 602000, false, ""});
    EXPECT_EQ(set.trust(), ClockJudge::Trust::Wait);
    set.look({year2025 + 5000 + 300000, 602001, false, ""});
    EXPECT_EQ(set.trust(), ClockJudge::Trust::Sure);
    EXPECT_EQ(velmora::stepBetween(5000, 3001), 0);
    EXPECT_EQ(velmora::stepBetween(5000, 3000), -2000);
    EXPECT_EQ(velmora::stampOf({5000, 2000, false, "x"}).offset, 3000);
}

TEST(ClockJudge, LooksAtTheMachinesClocks)
{
    auto const wall = [] {
        auto const now = std::chrono::system_clock::now().time_since_epoch();
        return std::chrono::floor<std::chrono::milliseconds>(now).count();
    };
    std::int64_t const before = wall();
    velmora::ClockLook const now = velmora::lookAtClocks();
    EXPECT_GE(now.wall, before);
    EXPECT_LE(now.wall, wall());
    EXPECT_GT(now.boot, 0);
    EXPECT_LT(now.boot, now.wall);
    EXPECT_EQ(now.bootId.size(), 36U);
    EXPECT_EQ(velmora::lookAtClocks().bootId, now.bootId);
    EXPECT_TRUE(velmora::knowsTimeServer(TIME_OK, STA_PLL));
    EXPECT_FALSE(velmora::knowsTimeServer(TIME_ERROR, STA_PLL | STA_UNSYNC));
    EXPECT_FALSE(velmora::knowsTimeServer(-1, 0)) << "nobody may ask here";
}

TEST(ClockJudge, KnowsAClockThatRunsOnABattery)
{
    testsupport::TemporaryFolder const folder;
    EXPECT_FALSE(velmora::hasClockBattery(folder.file("none")));
    EXPECT_FALSE(velmora::hasClockBattery(folder.path()));
    for (char const* const name : {"rtc0", "rtc1"}) {
        std::filesystem::create_directory(folder.file(name));
        std::ofstream(folder.file(name) + "/hctosys") << "0\n";
    }
    EXPECT_FALSE(velmora::hasClockBattery(folder.path())) << "another one set the clock at the start";
    std::ofstream(folder.file("rtc1/hctosys")) << "1\n";
    EXPECT_TRUE(velmora::hasClockBattery(folder.path()));
}

} // namespace
