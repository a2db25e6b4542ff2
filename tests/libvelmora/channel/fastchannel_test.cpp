#include "libvelmora/channel/fastchannel.h"
#include "tests/libvelmora/channel/channelrig.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using test::ChannelRig;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Optional;
using ScriptedReply = support::ScriptedWire::Reply;

std::string const engineSpeed = "7E804410C1AF8";

TEST(FastChannel, AReceiveThatCanBringNothingEndsAfterAShortGrace)
{
    ChannelRig rig;
    EXPECT_THAT(rig.ask("ATE0"), Optional(std::string("OK")));
    WireTime const before = rig.wire->now();
    std::vector<unsigned char> bytes;
    EXPECT_FALSE(rig.channel.receive(bytes, 200));
    EXPECT_LE(rig.wire->now() - before, WireTime(5));
    rig.wire->say("more\r>", WireTime(1)); // a second piece
    EXPECT_TRUE(rig.channel.receive(bytes, 200));
    for (int i = 0; i < 10; ++i) {
        EXPECT_FALSE(rig.channel.receive(bytes, 200));
    }
    rig.wire->say("more\r>", WireTime(1));
    EXPECT_TRUE(rig.channel.receive(bytes, 200)) << "an adapter that does so is always waited for";
}

TEST(FastChannel, AnAdapterThatSendsNoSecondPiecesIsNotWaitedForAgainAndAgain)
{
    ChannelRig rig;
    rig.ask("ATE0");
    std::vector<unsigned char> bytes;
    WireTime before = rig.wire->now();
    for (int i = 0; i < 10; ++i) {
        EXPECT_FALSE(rig.channel.receive(bytes, 200));
    }
    EXPECT_LE(rig.wire->now() - before, WireTime(4));
    rig.wire->say("more\r>", WireTime(0));
    EXPECT_TRUE(rig.channel.receive(bytes, 200)) << "what is there is taken all the same";
}

TEST(FastChannel, WaitsForAReplyAsLongAsItIsTold)
{
    ChannelRig rig;
    rig.wire->on("ATDP", ScriptedReply{{"AUTO\r\r>", WireTime(520)}});
    EXPECT_THAT(rig.ask("ATDP", 1000), Optional(std::string("AUTO")));
    EXPECT_EQ(rig.met(Habit::LostPrompt), 0U);
}

// The way by a radio takes longer than the adapter does: neither the core's limit nor the channel's own counts it.
TEST(FastChannel, TheWayToTheAdapterComesOnTopOfAllLimits)
{
    ScriptedReply const late{{"OK\r\r>", WireTime(720)}};
    ChannelRig near;
    near.wire->on("ATE0", late);
    WireTime const begin = near.wire->now();
    EXPECT_EQ(near.ask("ATE0", 250), std::nullopt);
    EXPECT_EQ(near.wire->now() - begin, WireTime(250));
    EXPECT_THAT(near.ask("ATL0"), Optional(std::string("OK")));
    EXPECT_EQ(near.met(Habit::LostPrompt), 1U);

    ChannelRig far(nullptr, {.port = {}, .latency = WireTime(200)});
    far.wire->on("ATE0", late);
    EXPECT_EQ(far.ask("ATE0", 500), std::nullopt);
    EXPECT_EQ(far.wire->now() - begin, WireTime(700)) << "in its slices once, not each time";
    EXPECT_THAT(far.ask("ATL0"), Optional(std::string("OK")));
    EXPECT_EQ(far.met(Habit::LostPrompt), 0U) << "it was on its way";
    far.wire->on("ATS0", ScriptedReply{{"OK\r\r>", WireTime(400)}});
    EXPECT_THAT(far.ask("ATS0", 250), Optional(std::string("OK")));
}

TEST(FastChannel, ALatePromptIsWaitedOutAndItsReplyIsNobodyElses)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", ScriptedReply{{engineSpeed + "\r\r>", WireTime(2600)}});
    rig.wire->on("ATRV", "12.6V");
    EXPECT_EQ(rig.ask("010C"), std::nullopt);
    EXPECT_THAT(rig.ask("ATRV"), Optional(std::string("12.6V")));
    EXPECT_EQ(rig.met(Habit::LatePrompt), 1U);
    EXPECT_EQ(rig.met(Habit::LostPrompt), 0U);
}

TEST(FastChannel, ALinkThatEndsEndsTheWaitForALatePrompt)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", ScriptedReply{});
    EXPECT_EQ(rig.ask("010C"), std::nullopt);
    rig.channel.invalidate();
    WireTime const before = rig.wire->now();
    EXPECT_EQ(rig.ask("ATRV"), std::nullopt);
    EXPECT_EQ(rig.wire->now(), before);
    EXPECT_FALSE(rig.channel.isValid());
}

TEST(FastChannel, APromptThatNeverCameCostsNoReply)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", ScriptedReply{{engineSpeed + "\r\r"}});
    EXPECT_THAT(rig.ask("010C"), Optional(engineSpeed));
    EXPECT_EQ(rig.met(Habit::LostPrompt), 1U);
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C", "ATI"));
}

TEST(FastChannel, AnAdapterThatSwallowsACommandIsWokenByItsIdentityAndNeverByABareReturn)
{
    ChannelRig rig;
    rig.wire->on("ATI", ScriptedReply{}).on("ATI", "ELM327 v1.5");
    EXPECT_THAT(rig.ask("ATI"), Optional(std::string("ELM327 v1.5"))) << "the first of all";
    rig.wire->on("ATL0", ScriptedReply{}).on("ATL0", "OK");
    EXPECT_THAT(rig.ask("ATL0", 750), Optional(std::string("OK")));
    rig.wire->on("04", ScriptedReply{});
    EXPECT_EQ(rig.ask("04"), std::nullopt);
    EXPECT_THAT(rig.ask("ATI"), Optional(std::string("ELM327 v1.5")));
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATI", "ATI", "ATL0", "ATI", "ATL0", "04", "ATI", "ATI"))
        << "a command that clears is never sent again";
}

TEST(FastChannel, HabitsThatDefeatedTheBringUpDoNotAnyMore)
{
    ChannelRig busy;
    busy.wire->on("ATI", "STOPPED").on("ATI", "ELM327 v1.5");
    busy.wire->on("0100", "NO DATA").on("0100", "SEARCHING...\r4100BE3EA813");
    EXPECT_THAT(busy.ask("ATI"), Optional(std::string("ELM327 v1.5")));
    busy.ask("ATTP0");
    EXPECT_THAT(busy.ask("0100"), Optional(HasSubstr("4100BE3EA813")));
    EXPECT_EQ(busy.met(Habit::AskedAgain), 2U);

    ChannelRig echoing;
    echoing.wire->on("ATL0", "ATL0\rOK").on("010C", "010C\r" + engineSpeed);
    echoing.connect();
    EXPECT_THAT(echoing.ask("010C"), Optional(engineSpeed));
    EXPECT_EQ(echoing.met(Habit::SettingsLost), 0U);

    ChannelRig heldBack; // its prompt would come with the next command
    heldBack.wire->on("ATI", "ELM327 v1.5").on("ATE0", ScriptedReply{{"ATE0\rOK\r"}});
    heldBack.ask("ATI");
    EXPECT_THAT(heldBack.ask("ATE0", 500), Optional(HasSubstr("OK")));
}

TEST(FastChannel, APromptWithoutAReplyIsNotTakenForOne)
{
    ChannelRig rig;
    rig.wire->on("ATL0", ScriptedReply{{">"}, {"OK\r\r>", WireTime(20)}});
    EXPECT_THAT(rig.ask("ATL0"), Optional(std::string("OK")));
    EXPECT_EQ(rig.met(Habit::EmptyReply), 1U);
}

TEST(FastChannel, WhatWasSaidUnaskedIsNobodysReply)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", engineSpeed);
    rig.wire->say("BUS ERROR\r\r>", WireTime(10));
    rig.wire->read(rig.wire->now());
    rig.wire->say("7E803410D20\r\r>", WireTime(0));
    rig.wire->say("7E80341", WireTime(0));
    EXPECT_THAT(rig.ask("010C"), Optional(engineSpeed));
    EXPECT_EQ(rig.met(Habit::StaleReply), 1U) << "the rest of a line; a whole reply is taken before";
}

TEST(FastChannel, AnAdapterThatResetItselfIsSetUpAgainOnce)
{
    for (char const* word : {"LV RESET", "ERR94", "ELM327 v1.5"}) {
        ChannelRig rig;
        rig.connect();
        rig.wire->on("010C", word).on("010C", engineSpeed).on("010C", word);
        EXPECT_THAT(rig.ask("010C", 5000), Optional(engineSpeed)) << word;
        EXPECT_THAT(rig.wire->takeCommands(),
                    ElementsAre("010C", "ATE0", "ATL0", "ATS0", "ATST64", "ATTP6", "ATH1", "010C"));
        EXPECT_EQ(rig.ask("010C", 5000), std::nullopt);
        EXPECT_FALSE(rig.channel.isValid()) << "twice in a minute is a lost link";
        EXPECT_TRUE(rig.channel.adapterFails());
        EXPECT_TRUE(rig.channel.adapterResets());
    }
}

TEST(FastChannel, AnAdapterThatStaysSilentIsToldButNotOneThatPauses)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->setSilent(true);
    EXPECT_EQ(rig.ask("ATRV", 2500), std::nullopt);
    EXPECT_TRUE(rig.channel.statistics().unanswered);
    EXPECT_FALSE(rig.channel.statistics().adapterSilent) << "two seconds are no more than a pause";
    EXPECT_EQ(rig.ask("010C"), std::nullopt);
    EXPECT_TRUE(rig.channel.statistics().adapterSilent);
    rig.wire->setSilent(false);
    rig.wire->on("010C", engineSpeed);
    EXPECT_THAT(rig.ask("010C"), Optional(engineSpeed));
    EXPECT_FALSE(rig.channel.statistics().adapterSilent);
    EXPECT_FALSE(rig.channel.statistics().unanswered);
}

TEST(FastChannel, OneRequestWithoutAWordIsEnoughToTellThatTheAdapterIsSilent)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->setSilent(true);
    EXPECT_EQ(rig.ask("04"), std::nullopt);
    EXPECT_FALSE(rig.channel.statistics().adapterSilent) << "a module may still be at it";
    EXPECT_EQ(rig.ask("ATRV", 500), std::nullopt);
    EXPECT_TRUE(rig.channel.statistics().adapterSilent);
}

TEST(FastChannel, KeepsTheAdaptersWordForARequestThatBroughtNothing)
{
    ChannelRig rig;
    rig.connect();
    auto const trouble = [&rig](std::string const& reply) {
        rig.wire->on("015C", reply);
        rig.ask("015C"); // as before
        rig.ask("015C");
        return rig.channel.statistics().trouble;
    };
    EXPECT_EQ(trouble("CAN ERROR"), "CAN ERROR");
    EXPECT_EQ(trouble("NO DATA"), "") << "which is the vehicle's silence";
    EXPECT_EQ(trouble("BUS BUSY"), "BUS BUSY");
    EXPECT_EQ(trouble("7E803415C5A\r7E903415C5A\rBUFFER FULL"), "") << "something came";
    EXPECT_EQ(trouble("7E803415C5A\rBUFFER FULL"), "BUFFER FULL") << "the line before it may have been cut";
}

TEST(FastChannel, ASearchBehindAResetIsToldToLookForCanAgain)
{
    for (char const* word : {"LV RESET", "ERR94"}) {
        ChannelRig rig;
        rig.bringUp();
        rig.ask("ATTP0"); // the bus is not known any more
        rig.wire->takeCommands();
        rig.wire->on("010C", word).on("010C", engineSpeed);
        EXPECT_THAT(rig.ask("010C", 5000), Optional(engineSpeed));
        EXPECT_THAT(rig.wire->takeCommands(), testing::Contains("ATFE")) << word;
    }
    ChannelRig known;
    known.connect();
    known.wire->on("010C", "ERR94").on("010C", engineSpeed);
    known.ask("010C", 5000);
    EXPECT_THAT(known.wire->takeCommands(), testing::Not(testing::Contains("ATFE"))) << "no search is to come";
}

TEST(FastChannel, AResetWithoutAWordShowsInTheEcho)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", "010C\r41 0C 1A F8").on("010C", engineSpeed);
    EXPECT_THAT(rig.ask("010C", 5000), Optional(engineSpeed));
    EXPECT_EQ(rig.met(Habit::SettingsLost), 1U);
}

TEST(FastChannel, ARequestThatChangesTheVehicleIsNeverSentTwice)
{
    for (char const* reply : {"STOPPED", "ELM327 v1.5", "7E804440", "04\r44"}) {
        ChannelRig rig;
        rig.connect();
        rig.wire->on("04", reply);
        rig.ask("04");
        rig.ask("ATRV");
        auto const commands = rig.wire->takeCommands();
        EXPECT_EQ(std::count(commands.begin(), commands.end(), "04"), 1) << reply;
    }
}

TEST(FastChannel, TheFarewellIsAnsweredHereUnlessTheAdapterIsToSleep)
{
    ChannelRig rig;
    rig.connect();
    EXPECT_THAT(rig.ask("ATLP", 10), Optional(std::string("OK")));
    EXPECT_THAT(rig.wire->takeCommands(), IsEmpty());
    ChannelRig sleepy(nullptr, {.port = {}, .sleepAtEnd = true});
    sleepy.connect();
    sleepy.ask("ATLP", 10);
    EXPECT_THAT(sleepy.wire->takeCommands(), ElementsAre("ATLP"));
}

TEST(FastChannel, LoggersSeeWhatReallyPassed)
{
    struct Tap : obd::IConnectionLogger
    {
        void onDataSent(std::vector<unsigned char> const& data) override { sent.append(data.begin(), data.end()); }
        void onDataReceived(std::vector<unsigned char> const& data) override
        {
            received.append(data.begin(), data.end());
        }
        std::string sent;
        std::string received;
    };
    ChannelRig rig;
    rig.connect();
    Tap tap;
    rig.channel.addLogger(&tap);
    rig.wire->on("010C", "SEARCHING...\r7E804410C1AF8CCCCCC");
    EXPECT_THAT(rig.ask("010C"), Optional(engineSpeed));
    EXPECT_EQ(tap.sent, "010C\r");
    EXPECT_EQ(tap.received, "SEARCHING...\r7E804410C1AF8CCCCCC\r\r");
    rig.channel.removeLogger(&tap);
    rig.ask("010C");
    EXPECT_EQ(tap.sent, "010C\r");
}

TEST(FastChannel, EachHabitHasAName)
{
    for (std::size_t i = 0; i < habitCount; ++i) {
        EXPECT_FALSE(habitName(static_cast<Habit>(i)).empty());
    }
}

} // namespace

} // namespace velmora
