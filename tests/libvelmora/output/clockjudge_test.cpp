#include "libvelmora/output/clockjudge.h"
#include "tests/support/records.h"

#include <gtest/gtest.h>

#include <chrono>

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
    velmora::ClockLook const now = velmora::lookAtClocks();
    auto const wall =
        std::chrono::duration_cast<std::chrono::milliseconds>(std::chrono::system_clock::now().time_since_epoch());
    EXPECT_NEAR(static_cast<double>(now.wall), static_cast<double>(wall.count()), 60000.0);
    EXPECT_GT(now.boot, 0);
    EXPECT_LT(now.boot, now.wall);
    EXPECT_EQ(velmora::lookAtClocks().bootId.size(), 36U);
}

} // namespace
