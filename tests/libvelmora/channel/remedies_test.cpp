// When a prompt that does not come is taken for lost, and what is done then.

#include "tests/libvelmora/channel/channelrig.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using test::ChannelRig;
using testing::ElementsAre;
using testing::Optional;
using Spoken = support::ScriptedWire::Reply;

std::string const rpmLine = "7E804410C1AF8";

void sendTo(ChannelRig& rig, std::string const& text)
{
    std::string const line = text + "\r";
    rig.channel.send({line.begin(), line.end()});
}

// Milliseconds from a command until the adapter is asked who it is, but for the last; -1 if that does not come within
// ten seconds.
long askedBehind(ChannelRig& rig, std::string const& command, std::string const& partial)
{
    rig.wire->on(command, partial.empty() ? Spoken{} : Spoken{{partial, WireTime(10)}});
    if (command == "ATI") {
        rig.ask("ATI"); // as it was asked before
    }
    sendTo(rig, command);
    rig.wire->takeCommands();
    WireTime const start = rig.wire->now();
    std::vector<unsigned char> bytes;
    while (rig.wire->now() - start < WireTime(10000) && rig.channel.isValid()) {
        long const passed = (rig.wire->now() - start).count();
        if (rig.channel.receive(bytes, 1)) {
            EXPECT_FALSE(rig.wire->takeCommands().empty()) << "without a prompt";
            return passed;
        }
        if (!rig.wire->takeCommands().empty()) {
            return passed;
        }
    }
    return -1;
}

struct Partial
{
    char const* command;
    char const* said; // 10 ms behind it, and nothing more
    long askedAfter;  // up to 1 ms early
};

TEST(LostPrompt, IsMissedInItsTime)
{
    Partial const rows[] = {
        {"ATRV", "", 599},
        {"ATRV", "12.6V\r", 409},
        {"ATI", "", 599},
        {"ATZ", "", -1},
        {"ATWS", "EL", -1},
        {"ATMA", "7E8\r", -1},
        {"010C", "7E804410C1AF8\r", 718}, // 409 ms for more modules, and 300
        {"010C", "7E8037F0112\r", 718},
        {"0178", "7E804417801\r", 718},
        {"010C", "7E8037F0178\r", 5309},
        {"010C", "SEARCHING...7E804410C1AF8\r", 718},
        {"010C", "SEARCHING 7E804410C1AF8\r", -1},
        {"010C", "SEARCH", -1},
        {"010C", "BUS INIT: ", -1},
        {"010C", "BUS INIT: ...OK\r", -1},
        {"010C", "...OK\r", -1},
        {"010C", "OK\r", -1},
        {"010C", "41.", -1},
        {"010C", "010C\r", -1},
        {"010C", "\r", -1},
        {"010C", "", 7999}, // on CAN, whose bus has spoken before, nothing is to be started
    };
    for (Partial const& row : rows) {
        ChannelRig rig;
        rig.connect();
        EXPECT_EQ(askedBehind(rig, row.command, row.said), row.askedAfter) << row.command << " " << row.said;
    }
}

TEST(LostPrompt, IsMissedLaterByTheWayToTheAdapter)
{
    for (Partial const& row :
         {Partial{"ATRV", "", 699}, Partial{"ATRV", "12.6V\r", 509}, Partial{"010C", "7E804410C1AF8\r", 818}}) {
        ChannelRig rig(nullptr, {.port = {}, .latency = WireTime(100)});
        rig.connect();
        EXPECT_EQ(askedBehind(rig, row.command, row.said), row.askedAfter) << row.command;
    }
}

TEST(LostPrompt, OfARequestIsMissedByTheAdaptersWait)
{
    std::pair<char const*, long> const rows[] = {
        {"ATST64", 718}, {"ATST19", 411}, {"ATSTFF", 1353}, {"ATST00", 1353}, {"ATST0A", 349}};
    for (auto const& [wait, after] : rows) {
        ChannelRig rig;
        rig.connect();
        rig.ask(wait);
        EXPECT_EQ(askedBehind(rig, "010C", rpmLine + "\r"), after) << wait;
    }
    ChannelRig untold; // how long it waits nobody has told it
    untold.ask("ATE0");
    EXPECT_EQ(askedBehind(untold, "010C", "41 0C 1A F8\r"), 1353);
    ChannelRig kLine;
    kLine.connect();
    kLine.ask("ATTP5");
    EXPECT_EQ(askedBehind(kLine, "010C", ""), -1) << "its bus may have to be started anew";
    ChannelRig unknown;
    unknown.bringUp();
    unknown.ask("ATTP0");
    EXPECT_EQ(askedBehind(unknown, "010C", ""), -1) << "a search takes its time";
}

TEST(LostPrompt, CostsWhatStoodBehindTheLastLineEnd)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", Spoken{{rpmLine + "\r7E9044"}});
    EXPECT_THAT(rig.ask("010C"), Optional(rpmLine));
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C", "ATI"));
    rig.wire->on("ATRV", Spoken{{"ATRV\r"}}).on("ATRV", "12.6V");
    EXPECT_THAT(rig.ask("ATRV"), Optional(std::string("12.6V"))) << "an echo alone is no reply";
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATRV", "ATI", "ATRV"));
    rig.wire->on("010D", Spoken{{"7E803"}}).on("010D", "7E803410D20");
    EXPECT_THAT(rig.ask("010D"), Optional(std::string("7E803410D20")));
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010D", "ATI", "010D"));
    rig.wire->on("04", Spoken{{"7E8"}});
    EXPECT_EQ(rig.ask("04", 1000), std::nullopt);
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("04", "ATI")) << "never again";
    EXPECT_EQ(rig.met(Habit::LostPrompt), 4U);
}

TEST(LostPrompt, OfTheFirstCommandIsRemediedThoughNobodyKnowsTheName)
{
    ChannelRig rig;
    rig.wire->on("ATE0", Spoken{}).on("ATE0", "OK").on("ATI", "ELM327 v2.1");
    EXPECT_THAT(rig.ask("ATE0"), Optional(std::string("OK")));
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATE0", "ATI", "ATE0"));
    ChannelRig other;
    other.wire->on("ATE0", Spoken{}).on("ATI", "41 0C");
    EXPECT_EQ(other.ask("ATE0"), std::nullopt) << "what it says is no name";
    EXPECT_TRUE(other.channel.isValid());
}

TEST(Waking, IsTriedAgainSoonBehindAnInterruption)
{
    auto const timeOf = [](Spoken const& first) {
        ChannelRig rig;
        rig.connect();
        rig.wire->on("ATRV", Spoken{}).on("ATRV", "12.6V").on("ATI", first).on("ATI", "ELM327 v1.5");
        rig.ask("ATI"); // as before
        rig.wire->takeCommands();
        WireTime const start = rig.wire->now();
        EXPECT_THAT(rig.ask("ATRV", 5000), Optional(std::string("12.6V")));
        EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATRV", "ATI", "ATI", "ATRV"));
        return (rig.wire->now() - start).count();
    };
    EXPECT_EQ(timeOf({{"STOPPED\r\r>"}}), 600 + 5 + 200 + 5 + 5);
    EXPECT_EQ(timeOf({{"?\r\r>"}}), 600 + 5 + 5 + 5) << "the rest of a command that was cut";
    EXPECT_EQ(timeOf({}), 600 + 700 + 5 + 5);
    EXPECT_EQ(timeOf({{"STOPPED\r\r>", WireTime(600)}}), 600 + 700 + 5 + 5) << "but no later than else";
}

TEST(Waking, IsTriedTwice)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->setSilent(true);
    rig.ask("ATRV", 500);
    rig.ask("ATRV", 100);
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATRV", "ATI", "ATI", "ATRV"));
}

TEST(Waking, ShowsTheLoggersWhatItHeard)
{
    struct HeardTap : obd::IConnectionLogger
    {
        void onDataSent(std::vector<unsigned char> const& data) override { all.append(data.begin(), data.end()); }
        void onDataReceived(std::vector<unsigned char> const& data) override { all.append(data.begin(), data.end()); }
        std::string all;
    } tap;
    ChannelRig rig;
    rig.connect();
    rig.channel.addLogger(&tap);
    rig.wire->on("010C", Spoken{{rpmLine + "\r7E9"}});
    rig.ask("010C");
    EXPECT_EQ(tap.all, "010C\rATI\rELM327 v1.5\r\r" + rpmLine + "\r7E9");
    tap.all.clear();
    rig.wire->say("stale", WireTime(0));
    rig.wire->on("ATRV", "12.6V");
    rig.ask("ATRV");
    EXPECT_EQ(tap.all, "staleATRV\r12.6V\r\r");
    HeardTap never;
    rig.channel.removeLogger(&never); // which was never there
    rig.channel.removeLogger(&tap);
}

// What the next command waits for that the host has given up on.
long millisUntilSent(ChannelRig& rig, std::string const& first, int patienceMs, std::string const& second)
{
    rig.ask(first, patienceMs);
    WireTime const start = rig.wire->now();
    sendTo(rig, second);
    return (rig.wire->now() - start).count();
}

TEST(LateReply, IsWaitedForAsLongAsItMayCome)
{
    ChannelRig command;
    command.connect();
    command.wire->on("ATRV", Spoken{}).on("ATDP", Spoken{});
    EXPECT_EQ(millisUntilSent(command, "ATRV", 250, "ATDP"), 350 + 5) << "then it is woken";
    ChannelRig request;
    request.connect();
    request.wire->on("010C", Spoken{{"SEARCHING..."}});
    EXPECT_EQ(millisUntilSent(request, "010C", 1000, "ATDP"), 5000 + 5);
    ChannelRig monitoring;
    monitoring.connect();
    monitoring.wire->on("ATMA", Spoken{{"7E8\r"}});
    EXPECT_EQ(millisUntilSent(monitoring, "ATMA", 1000, "ATDP"), 5) << "which ends by a character alone";
    ChannelRig blank;
    blank.connect();
    blank.wire->on("010C", Spoken{{">", WireTime(1100)}, {rpmLine + "\r\r>", WireTime(300)}}).on("ATDP", "AUTO");
    EXPECT_EQ(millisUntilSent(blank, "010C", 1000, "ATDP"), 400) << "a prompt without a reply is none";
    EXPECT_EQ(blank.met(Habit::LatePrompt), 1U);
    EXPECT_EQ(blank.met(Habit::LostPrompt), 0U);
    std::vector<unsigned char> bytes;
    ASSERT_TRUE(blank.channel.receive(bytes, 500));
    EXPECT_EQ(std::string(bytes.begin(), bytes.end()), "AUTO\r") << "and nothing of the late one";
}

// A command has its time, and the way to the adapter, though the silence is already long.
TEST(Silence, OfAFarAdapterEndsWithTheLastCommandsTime)
{
    ChannelRig rig(nullptr, {.port = {}, .latency = WireTime(200)});
    rig.connect();
    rig.wire->setSilent(true);
    WireTime const start = rig.wire->now();
    rig.ask("ATRV", 3000);
    rig.wire->read(start + WireTime(6100));
    sendTo(rig, "ATDP");
    EXPECT_EQ(rig.wire->now() - start, WireTime(7900)) << "asked twice who it is before";
    std::vector<unsigned char> bytes;
    while (rig.channel.isValid() && rig.wire->now() - start < WireTime(20000)) {
        rig.channel.receive(bytes, 100);
    }
    EXPECT_EQ(rig.wire->now() - start, WireTime(7900 + 800 + 1800));
    EXPECT_TRUE(rig.channel.adapterGone());
}

TEST(Silence, EndsWithAReplyThoughTheNameIsNotTold)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("ATI", Spoken{}).on("ATRV", "12.6V");
    rig.ask("ATI"); // as before
    rig.wire->setSilent(true);
    WireTime const start = rig.wire->now();
    while (rig.wire->now() - start < WireTime(5500)) {
        rig.ask("ATRV", 300);
    }
    EXPECT_TRUE(rig.channel.statistics().adapterSilent);
    rig.wire->setSilent(false);
    EXPECT_THAT(rig.ask("ATRV", 500), Optional(std::string("12.6V")));
    EXPECT_FALSE(rig.channel.statistics().adapterSilent);
}

TEST(Silence, BeginsWithTheLastByteWhateverTheClock)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->read(rig.wire->now() + WireTime(100000));
    rig.wire->on("015C", "CAN ERROR");
    rig.ask("015C");
    rig.ask("015C");
    EXPECT_EQ(rig.channel.statistics().trouble, "CAN ERROR");
    rig.wire->setSilent(true);
    WireTime const start = rig.wire->now();
    rig.ask("ATRV", 500);
    rig.ask("ATRV", 500);
    EXPECT_EQ(rig.channel.statistics().trouble, "") << "which is no word of a silent one";
    while (rig.wire->now() - start < WireTime(4900)) {
        EXPECT_FALSE(rig.channel.statistics().adapterSilent) << (rig.wire->now() - start).count();
        rig.ask("ATRV", 100);
    }
    rig.ask("ATRV", 200);
    EXPECT_TRUE(rig.channel.statistics().adapterSilent);
}

} // namespace

} // namespace velmora
