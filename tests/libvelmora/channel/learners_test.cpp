// What the channel learns of an adapter: how many frames a request brings, whether waits are to be cut, whether it is
// still there.

#include "libvelmora/channel/countlearner.h"
#include "libvelmora/channel/silencewatch.h"
#include "libvelmora/channel/waitcutter.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using testing::Optional;

FrameSet const oneFrame{{0x7E8, 1}};
FrameSet const threeFrames{{0x7E8, 1}, {0x7E9, 2}};
WireTime const late100s{100000};

// Two equal plain replies of 100 ms.
CountLearner learntOf(FrameSet const& frames)
{
    CountLearner learner;
    learner.learn("010C", frames, WireTime(100), late100s);
    learner.learn("010C", frames, WireTime(100), late100s);
    return learner;
}

TEST(CountLearner, TakesTwoEqualRepliesInARow)
{
    CountLearner learner;
    EXPECT_EQ(learner.countFor("010C", WireTime(0)), std::nullopt);
    learner.learn("010C", threeFrames, WireTime(100), late100s);
    EXPECT_EQ(learner.countFor("010C", late100s), std::nullopt);
    EXPECT_TRUE(learner.learnt().empty());
    learner.learn("010C", oneFrame, WireTime(100), late100s);
    EXPECT_EQ(learner.countFor("010C", late100s), std::nullopt) << "they were not equal";
    learner.learn("010C", oneFrame, WireTime(100), late100s);
    EXPECT_THAT(learner.countFor("010C", late100s), Optional(1U));
    EXPECT_EQ(learner.countFor("010D", late100s), std::nullopt);
    EXPECT_THAT(learntOf(threeFrames).countFor("010C", late100s), Optional(3U)) << "of all modules";
    EXPECT_EQ(learner.learnt(), (std::map<std::string, FrameSet>{{"010C", oneFrame}}));
}

TEST(CountLearner, CountsUpToNine)
{
    EXPECT_THAT(learntOf({{1, 4}, {2, 5}}).countFor("010C", late100s), Optional(9U));
    EXPECT_EQ(learntOf({{1, 5}, {2, 5}}).countFor("010C", late100s), std::nullopt);
    EXPECT_EQ(learntOf({}).countFor("010C", late100s), std::nullopt);
    CountLearner once;
    once.learn("010C", {}, WireTime(100), late100s);
    EXPECT_TRUE(once.learnt().empty());
}

TEST(CountLearner, AsksPlainlyHalfAMinuteAfterTheLastPlainReply)
{
    CountLearner const learner = learntOf(oneFrame);
    EXPECT_TRUE(learner.countFor("010C", late100s + WireTime(29999)));
    EXPECT_FALSE(learner.countFor("010C", late100s + WireTime(30000)));
    CountLearner recalled;
    recalled.recall("010C", threeFrames);
    EXPECT_THAT(recalled.countFor("010C", WireTime(29999)), Optional(3U));
    EXPECT_FALSE(recalled.countFor("010C", WireTime(30000)));
}

TEST(CountLearner, OtherModulesThanBeforeUnlearnAll)
{
    CountLearner learner = learntOf(oneFrame);
    learner.learn("010D", oneFrame, WireTime(100), late100s);
    learner.learn("0105", oneFrame, WireTime(100), late100s);
    learner.learn("0105", oneFrame, WireTime(100), late100s);
    learner.learn("010D", threeFrames, WireTime(100), late100s); // seen once before, so nothing is in doubt
    EXPECT_TRUE(learner.countFor("010C", late100s));
    learner.learn("010C", threeFrames, WireTime(100), late100s);
    EXPECT_FALSE(learner.countFor("010C", late100s));
    EXPECT_FALSE(learner.countFor("0105", late100s));
    learner.learn("010C", threeFrames, WireTime(100), late100s);
    EXPECT_THAT(learner.countFor("010C", late100s), Optional(3U)) << "which was the second of these";
    for (int i = 0; i < 3; ++i) {
        EXPECT_TRUE(learner.countFor("010C", late100s)) << i;
        learner.accept("010C", threeFrames, WireTime(99));
    }
    EXPECT_FALSE(learner.countFor("010C", late100s)) << "it is judged like any other";
    learner.clear();
    EXPECT_TRUE(learner.learnt().empty());
}

// The quickest of three counted replies against the quickest plain one.
bool pays(std::vector<int> const& plain, std::vector<int> const& counted)
{
    CountLearner learner;
    for (int const took : plain) {
        learner.learn("010C", oneFrame, WireTime(took), late100s);
    }
    for (int const took : counted) {
        EXPECT_TRUE(learner.countFor("010C", late100s)) << "judged too soon";
        EXPECT_TRUE(learner.accept("010C", oneFrame, WireTime(took)));
    }
    EXPECT_EQ(learner.learnt().contains("010C"), learner.countFor("010C", late100s).has_value());
    return learner.countFor("010C", late100s).has_value();
}

TEST(CountLearner, CountingPaysWhenItSavesAFifth)
{
    EXPECT_TRUE(pays({100, 100}, {80, 80, 80}));
    EXPECT_FALSE(pays({100, 100}, {81, 81, 81}));
    EXPECT_TRUE(pays({100, 100}, {300, 300})) << "two replies are not enough to tell";
    EXPECT_TRUE(pays({100, 100}, {300, 80, 300}));
    EXPECT_FALSE(pays({100, 300}, {90, 90, 90}));
    EXPECT_FALSE(pays({300, 100}, {90, 90, 90}));
    CountLearner recalled; // no plain reply was timed
    recalled.recall("010C", oneFrame);
    for (int i = 0; i < 4; ++i) {
        EXPECT_TRUE(recalled.accept("010C", oneFrame, WireTime(500)));
        EXPECT_TRUE(recalled.countFor("010C", WireTime(0)));
    }
}

TEST(CountLearner, TakesOnlyWhatThePlainRepliesHeld)
{
    CountLearner learner = learntOf(threeFrames);
    EXPECT_FALSE(learner.works());
    EXPECT_FALSE(learner.accept("010C", oneFrame, WireTime(10)));
    EXPECT_FALSE(learner.accept("010D", threeFrames, WireTime(10)));
    EXPECT_FALSE(learner.works());
    EXPECT_TRUE(learner.accept("010C", threeFrames, WireTime(10)));
    EXPECT_TRUE(learner.works());
    learner.recall("010C", oneFrame);
    EXPECT_THAT(learner.countFor("010C", late100s), Optional(3U)) << "what was seen is better than what was kept";
    learner.forget("010C");
    EXPECT_FALSE(learner.countFor("010C", late100s));
}

TEST(CountLearner, ThreeFailuresEndIt)
{
    CountLearner learner = learntOf(oneFrame);
    for (int i = 0; i < 3; ++i) {
        EXPECT_FALSE(learner.isOff()) << i;
        learner.learn("0105", oneFrame, WireTime(100), late100s);
        learner.learn("0105", oneFrame, WireTime(100), late100s);
        learner.fail("0105");
        EXPECT_FALSE(learner.countFor("0105", late100s)) << "learnt anew";
        EXPECT_EQ(learner.countFor("010C", late100s).has_value(), i < 2);
    }
    EXPECT_TRUE(learner.isOff());
    CountLearner off = learntOf(oneFrame);
    off.switchOff();
    EXPECT_FALSE(off.countFor("010C", late100s));
    off.fail("010C");
    EXPECT_TRUE(off.isOff()) << "one failure switches nothing on";
}

TEST(WaitCutter, PaysBehindTwoLateRepliesInARow)
{
    WaitCutter cutter;
    WireTime const agreed{102};
    cutter.saw(WireTime(203), agreed);
    EXPECT_FALSE(cutter.pays());
    cutter.saw(WireTime(202), agreed); // no later than a slow adapter explains
    cutter.saw(WireTime(203), agreed);
    EXPECT_FALSE(cutter.pays());
    cutter.saw(WireTime(203), agreed);
    EXPECT_TRUE(cutter.pays());
    EXPECT_EQ(cutter.doubt(), WireTime(0));
    cutter.saw(WireTime(102), agreed);
    EXPECT_FALSE(cutter.pays());
}

TEST(WaitCutter, GivesUpWhereItDoesNotHelp)
{
    WaitCutter slow;
    slow.recall();
    slow.cut(WireTime(151), true);
    slow.cut(WireTime(150), true); // soon enough
    EXPECT_TRUE(slow.pays());
    slow.cut(WireTime(151), true);
    EXPECT_FALSE(slow.pays());
    WaitCutter breaking;
    breaking.recall();
    breaking.cut(WireTime(4), false);
    EXPECT_FALSE(breaking.pays()) << "a reply was lost by it";
}

TEST(WaitCutter, DoubtsWhatItRecallsUntilItIsSeen)
{
    for (bool const bySight : {true, false}) {
        WaitCutter cutter;
        cutter.recall();
        EXPECT_TRUE(cutter.pays());
        EXPECT_EQ(cutter.doubt(), WireTime(30));
        if (bySight) {
            cutter.saw(WireTime(400), WireTime(102));
        } else {
            cutter.cut(WireTime(4), true);
        }
        EXPECT_EQ(cutter.doubt(), WireTime(0));
        EXPECT_TRUE(cutter.pays());
    }
}

TEST(SilenceWatch, TellsWhoIsGoneFromWhoPauses)
{
    SilenceWatch watch;
    EXPECT_EQ(watch.end(), WireTime::max());
    watch.wrote(WireTime(1000));
    watch.wrote(WireTime(2000));
    EXPECT_EQ(watch.end(), WireTime(9000)) << "from the first line that brought nothing";
    EXPECT_FALSE(watch.isGone(WireTime(20000))) << "it was not asked who it is";
    watch.wrote(WireTime(3000));
    EXPECT_FALSE(watch.isGone(WireTime(8999)));
    EXPECT_TRUE(watch.isGone(WireTime(9000)));
    watch.heard();
    EXPECT_EQ(watch.end(), WireTime::max());
    watch.wrote(WireTime(9500));
    EXPECT_EQ(watch.end(), WireTime(17500));
    EXPECT_FALSE(watch.isGone(WireTime(30000)));
}

} // namespace

} // namespace velmora
