// Replies that come later than anybody waits for, and those that stop in the middle for a while.

#include "libvelmora/channel/fastchannel.h"
#include "libvelmora/channel/lateanswers.h"
#include "tests/libvelmora/channel/channelrig.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

namespace velmora {

namespace {

using test::ChannelRig;
using testing::Optional;

TEST(LateReplies, OneThatStopsInTheMiddleComesWhole)
{
    for (int const pause : {900, 1700, 2500, 4500}) {
        ChannelRig rig;
        rig.connect();
        rig.wire->on("0120", "64120A007A011\r7E906412000000001").on("ATRV", "12.6V");
        rig.wire->say("7E80", WireTime(5));
        rig.wire->holdUntil(rig.wire->now() + WireTime(pause)); // and whatever is asked meanwhile
        EXPECT_THAT(rig.ask("0120", 10000), Optional(std::string("7E8064120A007A0117E906412000000001"))) << pause;
        EXPECT_THAT(rig.ask("ATRV", 500), Optional(std::string("12.6V"))) << pause;
        EXPECT_THAT(rig.ask("ATRV", 500), Optional(std::string("12.6V"))) << pause;
        auto const commands = rig.wire->takeCommands();
        EXPECT_EQ(std::count(commands.begin(), commands.end(), "0120"), 1) << pause;
    }
}

TEST(LateReplies, ACommandsPromptIsWaitedForUpToFiveSeconds)
{
    for (int const pause : {700, 1300, 2100, 3500, 4800}) {
        ChannelRig rig;
        rig.connect();
        rig.wire->on("ATRV", "12.6V");
        rig.wire->on("ATDP", "AUTO");
        rig.wire->holdUntil(rig.wire->now() + WireTime(pause));
        WireTime const start = rig.wire->now();
        rig.ask("ATRV", 500); // its own answer may still have come
        for (int i = 0; i < 3; ++i) {
            EXPECT_THAT(rig.ask("ATDP", 500), Optional(std::string("AUTO"))) << pause << " " << i;
        }
        EXPECT_THAT(rig.ask("ATRV", 500), Optional(std::string("12.6V"))) << pause;
        EXPECT_LT(rig.wire->now() - start, WireTime(pause + 1000));
        EXPECT_TRUE(rig.channel.isValid());
    }
}

TEST(LateReplies, AnAdapterThatIsSlowForEverythingIsWaitedFor)
{
    for (int const lag : {450, 590, 610, 640, 690, 720, 800, 1100, 1400}) {
        ChannelRig rig;
        rig.wire->setLag(WireTime(lag));
        rig.wire->on("ATI", "ATI\rELM327 v1.5").on("AT@1", "AT@1\rOBDII").on("AT@2", "AT@2\r?");
        rig.wire->on("0100", "7E8064100BE3EA813").on("010C", "7E804410C0BB8").on("ATRV", "12.6V");
        EXPECT_THAT(rig.ask("ATI", 1500), Optional(std::string("ATIELM327 v1.5"))) << lag;
        std::optional<std::string> const described = rig.ask("AT@1", 500); // no more than that is lost
        EXPECT_EQ(described.value_or("AT@1OBDII"), "AT@1OBDII") << lag;
        EXPECT_THAT(rig.ask("AT@2", 500), Optional(std::string("AT@2?"))) << lag;
        for (char const* command : {"ATE0", "ATL0", "ATH1", "ATSTFF"}) {
            EXPECT_THAT(rig.ask(command, 500), Optional(std::string("OK"))) << lag << command;
        }
        EXPECT_THAT(rig.ask("0100", 1500), Optional(std::string("7E8064100BE3EA813"))) << lag;
        rig.channel.onConnected();
        EXPECT_THAT(rig.ask("010C", 1500), Optional(std::string("7E804410C0BB8"))) << lag;
        EXPECT_THAT(rig.ask("ATRV", 500), Optional(std::string("12.6V"))) << lag;
        auto const commands = rig.wire->takeCommands();
        EXPECT_LE(std::count(commands.begin(), commands.end(), "ATI"), 2) << lag;
    }
}

TEST(LateAnswers, AreOwedUntilTheyComeOrFiveSecondsLong)
{
    LateAnswers late;
    EXPECT_FALSE(late.owes(WireTime(0)));
    late.askedIdentity(WireTime(1000));
    late.askedIdentity(WireTime(2000));
    late.settledIdentity();
    EXPECT_TRUE(late.owes(WireTime(7000)));
    EXPECT_FALSE(late.owes(WireTime(7001)));
    late.askedIdentity(WireTime(8000)); // what was owed before is not any more
    late.settledIdentity();
    EXPECT_FALSE(late.owes(WireTime(8000)));
    late.settledIdentity();
    late.askedIdentity(WireTime(9000));
    EXPECT_TRUE(late.owes(WireTime(9000)));
}

TEST(LateAnswers, LatenessIsThatOfTheLastCommand)
{
    LateAnswers late;
    EXPECT_EQ(late.lateness(), WireTime(0));
    late.tookForCommand(WireTime(301));
    EXPECT_EQ(late.lateness(), WireTime(301));
    late.tookForCommand(WireTime(60000));
    EXPECT_EQ(late.lateness(), WireTime(5000));
    late.tookForCommand(WireTime(300));
    EXPECT_EQ(late.lateness(), WireTime(0));
}

} // namespace

} // namespace velmora
