#include "libvelmora/poll/pollpace.h"
#include "libvelmora/poll/pollplan.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using velmora::MultiLimit;
using velmora::MultiLimits;
using velmora::PollWish;

std::string describe(std::vector<velmora::PollTask> const& tasks)
{
    std::string text;
    for (velmora::PollTask const& task : tasks) {
        text += text.empty() ? "" : " | ";
        for (unsigned char const pid : task.pids) {
            text += std::to_string(pid) + ",";
        }
        text += "of";
        for (std::size_t const member : task.members) {
            text += " " + std::to_string(member);
        }
        if (task.hertz) {
            text += " at " + std::to_string(static_cast<int>(*task.hertz));
        }
    }
    return text;
}

std::string plan(std::vector<PollWish> const& wishes, MultiLimits const& limits)
{
    return describe(velmora::planPolling(
        wishes, limits, [](unsigned char pid) { return pid < 0x80 ? std::optional<std::size_t>(1) : std::nullopt; }));
}

MultiLimits limits(std::size_t first, std::size_t second = 1)
{
    MultiLimits limits{{0x7E8, MultiLimit(first)}, {0x7E9, MultiLimit(second)}};
    for (auto& [module, limit] : limits) {
        limit.proved(3); // as far as its limit allows
    }
    return limits;
}

TEST(PollPlan, OnePidARequestServesAllModules)
{
    EXPECT_EQ(plan({{0x7E8, 12, {}}, {0x7E8, 13, {}}, {0x7E9, 12, {}}}, limits(1)), "12,of 0 2 | 13,of 1");
}

TEST(PollPlan, GroupsAreEvenAndKeepTheOrder)
{
    std::vector<PollWish> wishes;
    for (unsigned char pid = 1; pid <= 8; ++pid) {
        wishes.push_back({0x7E8, pid, {}});
    }
    EXPECT_EQ(plan(wishes, limits(6)), "1,2,3,4,of 0 1 2 3 | 5,6,7,8,of 4 5 6 7");
    wishes.resize(6);
    EXPECT_EQ(plan(wishes, limits(6)), "1,2,3,4,5,6,of 0 1 2 3 4 5");
}

TEST(PollPlan, RatesHaveRequestsOfTheirOwn)
{
    EXPECT_EQ(plan({{0x7E8, 12, 10.0}, {0x7E8, 13, 5.0}, {0x7E8, 4, 10.0}, {0x7E8, 5, {}}}, limits(6)),
              "12,4,of 0 2 at 10 | 13,of 1 at 5 | 5,of 3");
    // The faster one of two rates serves both.
    EXPECT_EQ(plan({{0x7E8, 12, 2.0}, {0x7E9, 12, 10.0}}, limits(6, 6)), "12,of 0 1 at 10");
}

TEST(PollPlan, WhoTakesNoSeveralIsAskedSingly)
{
    // Module 7E9 takes one; what only 7E8 is asked goes together all the same.
    EXPECT_EQ(plan({{0x7E8, 12, {}}, {0x7E8, 13, {}}, {0x7E8, 4, {}}, {0x7E9, 12, {}}}, limits(6)),
              "12,of 0 3 | 13,4,of 1 2");
    MultiLimits alone = limits(6);
    alone.at(0x7E8).leftOut(13);
    EXPECT_EQ(plan({{0x7E8, 12, {}}, {0x7E8, 13, {}}, {0x7E8, 4, {}}, {0x7E8, 0xA6, {}}}, alone),
              "13,of 1 | 166,of 3 | 12,4,of 0 2");
}

TEST(PollPlan, AModuleWithoutALimitTakesOnePid)
{
    EXPECT_EQ(plan({{0x7EA, 12, {}}, {0x7EA, 13, {}}}, limits(6)), "12,of 0 | 13,of 1");
}

TEST(PollPlan, DerivedValuesStandAlone)
{
    EXPECT_EQ(plan({{0x7E8, 12, {}}, {0x7E8, 0xF0, 1.0, true}, {0x7E8, 13, {}}}, limits(6)),
              "12,13,of 0 2 | of 1 at 1");
}

TEST(PollPace, FollowsTheBus)
{
    velmora::PollWill const fast{true, 6};
    velmora::PollPace const can = velmora::choosePace(fast, obd::ObdProtocolCan29, 0);
    EXPECT_EQ(can.floor.count(), 0);
    EXPECT_EQ(can.pidsPerRequest, 6U);
    EXPECT_TRUE(can.addresses);
    velmora::PollPace const unhurried = velmora::choosePace({}, obd::ObdProtocolCan11, 0);
    EXPECT_EQ(unhurried.floor.count(), 30);
    EXPECT_EQ(unhurried.pidsPerRequest, 1U);
    EXPECT_FALSE(unhurried.addresses);
    for (obd::ObdProtocol const line : {obd::ObdProtocolIso9141, obd::ObdProtocolIso14230}) {
        EXPECT_EQ(velmora::choosePace(fast, line, 2010).floor.count(), 30);
        EXPECT_EQ(velmora::choosePace(fast, line, 2010).pidsPerRequest, 1U);
    }
    EXPECT_EQ(velmora::choosePace(fast, obd::ObdProtocolJ1850, 0).gap.count(), 100);
    EXPECT_EQ(velmora::choosePace(fast, obd::ObdProtocolJ1850, 2002).gap.count(), 100);
    EXPECT_EQ(velmora::choosePace(fast, obd::ObdProtocolJ1850, 2003).gap.count(), 0);
    EXPECT_EQ(velmora::choosePace(fast, obd::ObdProtocolJ1850, 2003).floor.count(), 0);
    EXPECT_EQ(velmora::choosePace(fast, obd::ObdProtocolJ1850, 2003).pidsPerRequest, 1U);
    EXPECT_EQ(velmora::carefulPace(obd::ObdProtocolJ1850).gap.count(), 100);
}

} // namespace
