// Exchanges in their details: what is asked twice, what is counted and told.

#include "tests/libvelmora/channel/channelrig.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using test::ChannelRig;
using testing::ElementsAre;
using testing::Optional;
using Parts = support::ScriptedWire::Reply;

std::string const rpmReply = "7E804410C1AF8";

TEST(AskedAgain, IsWhatMayDoBetterAtOnce)
{
    struct Row
    {
        char const* command;
        char const* reply;
        int times;
    };
    Row const rows[] = {
        {"010C", "STOPPED", 2},
        {"ATRV", "STOPPED", 2},
        {"ATI", "?", 2},
        {"ATRV", "?", 1},
        {"010C", "?", 1},
        {"010C", "7E804410C1A", 2},
        {"010C", "SEARCHING...", 2},
        {"010C", "SEARCHING...\rUNABLE TO CONNECT", 1},
        {"010C", "NO DATA", 1},
        {"010C", "CAN ERROR", 1},
        {"04", "STOPPED", 1},
        {"04", "7E8044", 1},
        {"010C", "7E804410C1AF8", 1},
        {"010C", "SEARCHING...\r7E804410C1AF8", 1},
        {"010C", "hello", 1},
        {"ATRV", "12.6V", 1},
    };
    for (Row const& row : rows) {
        ChannelRig rig;
        rig.connect();
        rig.wire->on(row.command, row.reply).on(row.command, row.reply);
        if (std::string(row.command) == "ATI") {
            rig.ask("ATI"); // as it was told before
            rig.wire->takeCommands();
        }
        rig.ask(row.command);
        auto const sent = rig.wire->takeCommands();
        EXPECT_EQ(std::count(sent.begin(), sent.end(), row.command), row.times) << row.command << " " << row.reply;
        EXPECT_EQ(rig.met(Habit::AskedAgain), static_cast<unsigned int>(row.times) - 1);
    }
}

// The first request may only have woken the vehicle; but where one bus after the other is tried, silence is the rule.
TEST(AskedAgain, IsTheFirstRequestOfTheFirstBusAlone)
{
    ChannelRig first;
    first.wire->on("0100", "NO DATA");
    first.ask("ATTP6");
    first.ask("0100");
    first.ask("0100");
    EXPECT_THAT(first.wire->takeCommands(), ElementsAre("ATTP6", "0100", "0100", "0100", "0100"));
    first.ask("ATTP7");
    first.ask("0100");
    EXPECT_THAT(first.wire->takeCommands(), ElementsAre("ATTP7", "0100"));
    ChannelRig unchosen;
    unchosen.wire->on("0100", "NO DATA");
    unchosen.ask("0100");
    EXPECT_THAT(unchosen.wire->takeCommands(), ElementsAre("0100"));
}

TEST(AskedAgain, HasItsTimeAnew)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("ATRV", "STOPPED").on("ATRV", Parts{{"12.6V\r\r>", WireTime(550)}});
    EXPECT_THAT(rig.ask("ATRV"), Optional(std::string("12.6V")));
    EXPECT_EQ(rig.met(Habit::LostPrompt), 0U);
}

TEST(OwnExchange, TakesAReplyInTheLastMomentAndBehindABlankOne)
{
    for (Parts const& reply : {Parts{{"OK\r\r>", WireTime(700)}}, Parts{{"\r>OK\r\r>", WireTime(5)}},
                               Parts{{"\r>", WireTime(300)}, {"OK\r\r>", WireTime(400)}}}) {
        ChannelRig rig;
        rig.connect();
        rig.wire->on("ATSH7E0", reply).on("010C", rpmReply);
        AddressedModule const engine(rig.channel, 0x7E8);
        EXPECT_THAT(rig.ask("010C"), Optional(rpmReply));
        EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATSH7E0", "010C", "ATSH7DF"));
        EXPECT_EQ(rig.met(Habit::EmptyReply), reply.front().bytes.starts_with("OK") ? 0U : 1U);
    }
    ChannelRig late;
    late.connect();
    late.wire->on("ATSH7E0", Parts{{"OK\r\r>", WireTime(701)}}).on("010C", rpmReply);
    AddressedModule const engine(late.channel, 0x7E8);
    late.ask("010C");
    EXPECT_THAT(late.wire->takeCommands(), testing::Contains("ATSH7DF")) << "by broadcast";
}

TEST(Statistics, OfAFreshChannelAreNone)
{
    ChannelRig rig;
    for (bool const asked : {false, true}) {
        ChannelStatistics const now = rig.channel.statistics();
        EXPECT_EQ(now.habits, HabitCounts{});
        EXPECT_EQ(now.exchanges, asked ? 1U : 0U);
        EXPECT_EQ(now.counted + now.fromMemory + now.waitsCut + now.slowestReplyMs, 0U);
        EXPECT_FALSE(now.adapterSilent || now.unanswered || now.countingWorks || now.countingOff);
        EXPECT_EQ(now.trouble, "");
        EXPECT_EQ(now.waitMs, std::nullopt);
        rig.ask("ATE0");
    }
    EXPECT_FALSE(rig.channel.takeReply().answered);
    EXPECT_FALSE(rig.channel.takeReply().broken);
    EXPECT_FALSE(rig.channel.adapterFails() || rig.channel.adapterResets() || rig.channel.adapterGone());
}

TEST(Statistics, TellOfExchangesAndTheSlowestReply)
{
    ChannelRig rig;
    rig.connect();
    EXPECT_EQ(rig.channel.statistics().exchanges, 9U);
    rig.wire->on("010C", Parts{{rpmReply + "\r", WireTime(70)}, {"\r>", WireTime(40)}});
    rig.ask("010C");
    EXPECT_EQ(rig.channel.statistics().exchanges, 10U);
    EXPECT_EQ(rig.channel.statistics().slowestReplyMs, 70U) << "to its last line";
    EXPECT_EQ(rig.channel.statistics().waitMs, std::nullopt);
    EXPECT_EQ(rig.channel.statistics().counted, 0U);
    EXPECT_FALSE(rig.channel.statistics().countingOff);
    EXPECT_FALSE(rig.channel.statistics().countingWorks);
}

TEST(Flood, WithoutAPromptIsALostLink)
{
    for (std::size_t const size : {1U << 20U, (1U << 20U) + 1}) {
        ChannelRig rig;
        rig.connect();
        rig.wire->on("ATMA", Parts{{std::string(size, 'A')}});
        rig.ask("ATMA", 100);
        EXPECT_EQ(rig.channel.isValid(), size == 1U << 20U);
        EXPECT_EQ(rig.channel.adapterFails(), size != 1U << 20U);
    }
}

TEST(BlankReply, IsOneWhereRepliesAreSwitchedOff)
{
    ChannelRig rig;
    rig.connect();
    rig.ask("ATR0");
    rig.wire->on("0105", "");
    EXPECT_THAT(rig.ask("0105", 500), Optional(std::string()));
    EXPECT_EQ(rig.met(Habit::EmptyReply), 0U);
}

} // namespace

} // namespace velmora
