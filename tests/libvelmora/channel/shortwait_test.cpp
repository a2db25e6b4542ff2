// How long the adapter waits behind a reply, where that can be made shorter or ended.

#include "tests/libvelmora/channel/channelrig.h"
#include "tests/libvelmora/channel/timedreplies.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using test::ChannelRig;
using test::Pieces;
using test::saidCounted;
using test::saidSlowly;
using test::speedLine;
using test::speedOfTwo;
using testing::ElementsAre;
using testing::Optional;

TEST(ShortWait, FollowsALongOneAndIsGivenBackForASilentModule)
{
    ChannelRig rig;
    rig.wire->on("0100", saidSlowly("7E8064100BE3EA813\r7E906410080000001", 400));
    rig.bringUp();
    rig.wire->takeCommands();
    rig.ask("0100");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("0100", "ATST19"));
    EXPECT_EQ(rig.channel.statistics().waitMs, 102U);
    rig.wire->on("010C", saidSlowly(speedLine, 102))
        .on("010C", saidSlowly(speedOfTwo, 400))
        .on("010C", saidSlowly(speedLine, 102));
    EXPECT_THAT(rig.ask("010C"), Optional(speedLine + "7E904410C1AF9"));
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C", "ATST64", "010C", "ATST19"));
    rig.ask("010C");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C")) << "once a request";
    rig.ask("ATLP", 10);
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATST64"));
}

TEST(ShortWait, IsNotForKLines)
{
    ChannelRig kLine;
    kLine.wire->on("0100", saidSlowly("86F1114100BE3EB81134", 400));
    kLine.bringUp();
    kLine.ask("ATTP5");
    kLine.wire->takeCommands();
    kLine.ask("0100");
    EXPECT_THAT(kLine.wire->takeCommands(), ElementsAre("0100"));
}

// An adapter that adapts its wait behind replies still gives silence all of ATST.
TEST(ShortWait, OfAnAdapterThatAdaptsItselfIsForTheBringUpOnly)
{
    ChannelRig rig;
    rig.wire->on("0100", saidSlowly("7E8064100BE3EA813\r7E906410080000001", 60)).on("0800", "NO DATA");
    rig.wire->on("0101", "NO DATA").on("0120", saidSlowly("7E8064120A007F011", 60));
    rig.bringUp();
    rig.wire->takeCommands();
    for (char const* request : {"0100", "0800", "0120"}) {
        rig.ask(request);
    }
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("0100", "ATST19", "0800", "0120"));
    rig.ask("0101");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("0101", "ATST64", "0101", "ATST19"))
        << "no mask: the full wait once";
    rig.channel.onConnected();
    rig.ask("0800");
    rig.ask("0100");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATST64", "0800", "0100"));
    EXPECT_EQ(rig.channel.statistics().waitMs, 102U) << "what was done is told all the same";
}

TEST(ShortWait, IsNeverUnderTwiceTheSlowestReply)
{
    ChannelRig rig;
    rig.wire->on("0100", Pieces{{"7E8064100BE3EA813\r", WireTime(90)}, {"\r>", WireTime(400)}});
    rig.bringUp();
    rig.wire->takeCommands();
    rig.ask("0100");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("0100", "ATST2C")); // 180 ms
}

// Agrees to ATST19 and waits 400 ms all the same.
void bringUpStubborn(ChannelRig& rig)
{
    rig.wire->on("0100", saidSlowly("7E8064100BE3EA813\r7E906410080000001", 400));
    rig.wire->on("0120", saidSlowly("7E8064120A007F011\r7E906412080000001", 400));
    rig.wire->on("0140", saidSlowly("7E8064140A007F011\r7E906414080000001", 400));
    rig.wire->on("010D", saidSlowly("7E803410D20", 400)).on("03", saidSlowly("7E8024300\r7E9024300", 400));
    rig.wire->on("04", saidSlowly("7E80144\r7E90144", 400)).on("010C", saidSlowly(speedOfTwo, 400));
    rig.wire->on("010C2", saidCounted(speedOfTwo));
    rig.bringUp();
    for (char const* request : {"0100", "0120", "0140"}) {
        rig.ask(request);
    }
    EXPECT_THAT(rig.wire->takeCommands(), testing::Not(testing::Contains(" "))) << "seen twice first";
}

TEST(StubbornWait, IsEndedByABlankOnceAllModulesHaveSpoken)
{
    ChannelRig rig;
    rig.wire->onInterrupt({{"STOPPED\r\r>", WireTime(4)}});
    bringUpStubborn(rig);
    WireTime const before = rig.wire->now();
    EXPECT_THAT(rig.ask("03"), Optional(std::string("7E80243007E9024300")));
    EXPECT_LE(rig.wire->now() - before, WireTime(20 + 103 + 4));
    EXPECT_GE(rig.wire->now() - before, WireTime(20 + 102)) << "not under what adapters have by default";
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("03", " "));
    rig.ask("010D");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010D")) << "a module is missing: it had the full wait";
    rig.ask("04");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("04")) << "nothing that changes the vehicle";
    for (int i = 0; i < 3; ++i) {
        EXPECT_THAT(rig.ask("010C"), Optional(speedLine + "7E904410C1AF9"));
    }
    rig.channel.onConnected();
    rig.ask("010C");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C", " ", "010C", " ", "010C", " ", "010C2"))
        << "a reply that was cut teaches its count like any other";
    EXPECT_EQ(rig.channel.statistics().waitsCut, 4U);
    EXPECT_EQ(rig.met(Habit::TrailingError), 0U);
}

TEST(StubbornWait, OfAnAdapterThatIsNotInterruptedIsWaitedOut)
{
    ChannelRig deaf;
    bringUpStubborn(deaf);
    for (int i = 0; i < 3; ++i) {
        EXPECT_THAT(deaf.ask("03"), Optional(std::string("7E80243007E9024300")));
    }
    EXPECT_THAT(deaf.wire->takeCommands(), ElementsAre("03", " ", "03", " ", "03"));

    ChannelRig breaking; // what it says behind the interruption is no whole reply
    breaking.wire->onInterrupt({{"7EA1009490\rSTOPPED\r\r>", WireTime(4)}});
    bringUpStubborn(breaking);
    EXPECT_THAT(breaking.ask("03"), Optional(std::string("7E80243007E9024300")));
    breaking.ask("03");
    EXPECT_THAT(breaking.wire->takeCommands(), ElementsAre("03", " ", "03", "03")) << "asked again, and left in peace";

    ChannelRig stopping; // by itself, behind the reply that is left to end by itself
    stopping.wire->onInterrupt({{"7EA1009490\rSTOPPED\r\r>", WireTime(4)}});
    bringUpStubborn(stopping);
    stopping.wire->on("03", "7E8024300\r7E9024300\rSTOPPED");
    EXPECT_THAT(stopping.ask("03"), Optional(std::string("7E80243007E9024300")));
    EXPECT_EQ(stopping.met(Habit::TrailingError), 1U);

    ChannelRig late; // the word for it is not the end
    late.wire->onInterrupt({{"STOPPED\r7E8024300\r\r>", WireTime(4)}});
    bringUpStubborn(late);
    EXPECT_THAT(late.ask("03"), Optional(std::string("7E80243007E9024300")));
    EXPECT_THAT(late.wire->takeCommands(), ElementsAre("03", " ", "03"));

    ChannelRig starting;
    starting.wire->onInterrupt({{"ELM327 v1.5\r\r>", WireTime(4)}});
    bringUpStubborn(starting);
    EXPECT_THAT(starting.ask("03", 5000), Optional(std::string("7E80243007E9024300")));
    starting.wire->takeCommands();
    for (int i = 0; i < 4; ++i) {
        starting.ask("03");
    }
    EXPECT_THAT(starting.wire->takeCommands(), testing::Not(testing::Contains(" "))) << "it is not provoked again";
    EXPECT_TRUE(starting.channel.isValid());
}

TEST(StubbornWait, IsLeftAloneWhereTheWaitMustNotBeShortened)
{
    ChannelRig recording(nullptr, {.port = {}, .shortWait = false});
    bringUpStubborn(recording);
    recording.ask("03");
    EXPECT_THAT(recording.wire->takeCommands(), ElementsAre("03"));

    ChannelRig kLine;
    kLine.wire->on("0100", saidSlowly("86F1114100BE3EB81134", 400)).on("03", saidSlowly("82F1114300C7", 400));
    kLine.bringUp();
    kLine.ask("ATTP5");
    for (int i = 0; i < 4; ++i) {
        kLine.ask("03");
    }
    EXPECT_THAT(kLine.wire->takeCommands(), testing::Not(testing::Contains(" ")));
}

} // namespace

} // namespace velmora
