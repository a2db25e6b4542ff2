// Where the channel's haste with waits begins and ends.

#include "tests/libvelmora/channel/channelrig.h"
#include "tests/libvelmora/channel/timedreplies.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using test::ChannelRig;
using test::Pieces;
using test::saidSlowly;
using test::speedLine;
using testing::Contains;
using testing::ElementsAre;
using testing::Not;

std::string const twoMasks = "7E8064100BE3EA813\r7E906410080000001";

// An adapter whose waits were found to be long while it was brought up, and are short now.
void hasten(ChannelRig& rig)
{
    rig.wire->on("0100", saidSlowly(twoMasks, 400));
    rig.bringUp();
    rig.ask("0100");
    rig.channel.onConnected();
    rig.wire->takeCommands();
}

TEST(HastyWait, IsForAdaptersThatListenNoticeablyLong)
{
    for (int const wait : {150, 151}) {
        ChannelRig rig;
        rig.connect();
        rig.wire->on("010C", saidSlowly(speedLine, wait));
        rig.ask("010C");
        EXPECT_THAT(rig.wire->takeCommands().size(), wait == 150 ? 1U : 2U) << wait;
        EXPECT_EQ(rig.channel.statistics().waitMs, wait == 150 ? std::nullopt : std::optional(102U));
    }
}

TEST(HastyWait, GrowsWithSlowRepliesAndEndsWhereItSavesNothing)
{
    ChannelRig rig;
    hasten(rig);
    auto const sentBehind = [&rig](std::string const& request, int millis) {
        rig.wire->on(request, Pieces{{"7E804410D1AF8\r7E904410D1AF8\r", WireTime(millis)}, {"\r>", WireTime(102)}});
        rig.ask(request);
        std::vector<std::string> sent = rig.wire->takeCommands();
        sent.erase(sent.begin());
        return sent;
    };
    EXPECT_THAT(sentBehind("010D", 51), ElementsAre()) << "102 ms are twice that";
    EXPECT_THAT(sentBehind("010D0C", 60), ElementsAre("ATST1E"));
    EXPECT_THAT(sentBehind("010D05", 55), ElementsAre()) << "nor does it shrink";
    EXPECT_THAT(sentBehind("010D11", 202), ElementsAre("ATST63"));
    EXPECT_EQ(rig.channel.statistics().waitMs, 405U);
    EXPECT_THAT(sentBehind("010D0B", 204), ElementsAre("ATST64")) << "which is what the library has set";
    EXPECT_EQ(rig.channel.statistics().waitMs, 405U) << "the last that was shorter";
}

TEST(HastyWait, IsGivenBackForWhoIsAskedAloneAndKeepsSilent)
{
    struct Row
    {
        RequestAddress address;
        char const* reply;
        bool again;
    };
    Row const rows[] = {
        {{.header = "7E1", .reply = "7E9"}, "NO DATA", true},
        {{.header = "7E1", .reply = "7E9"}, "7E905621E1C0320", false},
        {{.header = "7E1", .reply = "7E9"}, "7E805621E1C0320", true},
        {{.header = "7E1"}, "NO DATA", false},
        {{.header = "7E1", .reply = "7E9", .waitMs = 600}, "NO DATA", false},
    };
    for (Row const& row : rows) {
        ChannelRig rig;
        hasten(rig);
        rig.wire->on("221E1C", row.reply);
        for (bool const first : {true, false}) {
            AddressedModule const scope(rig.channel, row.address);
            rig.ask("221E1C");
            auto const sent = rig.wire->takeCommands();
            EXPECT_EQ(std::count(sent.begin(), sent.end(), "221E1C"), row.again && first ? 2 : 1)
                << row.reply << " " << row.address.reply;
            EXPECT_EQ(std::count(sent.begin(), sent.end(), "ATST64"), row.again && first ? 1 : 0);
        }
    }
    ChannelRig module;
    hasten(module);
    module.wire->on("010C", "NO DATA");
    AddressedModule const gearbox(module.channel, 0x7E9);
    module.ask("010C");
    EXPECT_THAT(module.wire->takeCommands(), ElementsAre("ATSH7E1", "010C", "ATST64", "010C", "ATST19", "ATSH7DF"));
}

// One module of two has spoken; the adapter's prompt came so long behind it.
TEST(HastyWait, ThatWasAsLongAsTheLibrarysAlreadyIsNotAskedFor)
{
    for (int const wait : {368, 369}) {
        ChannelRig rig;
        hasten(rig);
        rig.wire->on("010C", saidSlowly(speedLine, wait));
        rig.ask("010C");
        auto const sent = rig.wire->takeCommands();
        EXPECT_EQ(std::count(sent.begin(), sent.end(), "010C"), wait == 369 ? 1 : 2) << wait;
    }
    ChannelRig writing;
    hasten(writing);
    writing.wire->on("04", "7E80144");
    writing.ask("04");
    EXPECT_THAT(writing.wire->takeCommands(), ElementsAre("04")) << "what changes the vehicle is not asked twice";
}

// The adapter is still at a request, so that the farewell can't be answered by giving the wait back.
TEST(HastyWait, IsLeftInForceWhereSomethingIsUnderWay)
{
    ChannelRig rig;
    hasten(rig);
    rig.wire->on("010C", Pieces{});
    for (std::string const line : {"010C\r", "ATLP\r"}) {
        rig.channel.send({line.begin(), line.end()});
    }
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C"));
}

// Adapters that agree to a shorter wait and do not keep to it.
void bringUpDeaf(ChannelRig& rig)
{
    for (char const* mask : {"0100", "0120", "0140"}) {
        std::string const item(mask + 2);
        rig.wire->on(mask, saidSlowly("7E80641" + item + "BE3EA813\r7E90641" + item + "80000001", 400));
    }
    rig.wire->onInterrupt({{"STOPPED\r\r>", WireTime(4)}});
    rig.bringUp();
    for (char const* mask : {"0100", "0120", "0140"}) {
        rig.ask(mask);
    }
    rig.wire->takeCommands();
}

TEST(CutWait, ComesBehindWholeLinesOnly)
{
    struct Row
    {
        char const* why;
        Pieces reply;
        bool isCut;
    };
    Row const rows[] = {
        {"two lines", {{"7E8024300\r7E9024300\r", WireTime(20)}, {"\r>", WireTime(400)}}, true},
        {"a line end first",
         {{"\r", WireTime(5)}, {"7E8024300\r7E9024300\r", WireTime(15)}, {"\r>", WireTime(400)}},
         true},
        {"line feeds", {{"7E8024300\r\n7E9024300\r\n", WireTime(20)}, {"\r\n>", WireTime(400)}}, true},
        {"no end of the last line", {{"7E8024300\r7E9024300", WireTime(20)}, {"\r\r>", WireTime(400)}}, false},
        {"a module is missing", {{"7E8024300\r", WireTime(20)}, {"\r>", WireTime(400)}}, false},
        {"a refusal", {{"7E8024300\r7E9037F0312\r", WireTime(20)}, {"\r>", WireTime(400)}}, false},
        {"trouble", {{"7E8024300\r7E9024300\rCAN ERROR\r", WireTime(20)}, {"\r>", WireTime(400)}}, false},
        {"late data", {{"7E8024300\r7E9024300\r", WireTime(180)}, {"\r>", WireTime(400)}}, true},
    };
    for (Row const& row : rows) {
        ChannelRig rig;
        bringUpDeaf(rig);
        rig.wire->on("03", row.reply);
        WireTime const before = rig.wire->now();
        EXPECT_NE(rig.ask("03", 3000), std::nullopt);
        auto const sent = rig.wire->takeCommands();
        EXPECT_EQ(std::count(sent.begin(), sent.end(), " "), row.isCut ? 1 : 0) << row.why;
        EXPECT_EQ(rig.channel.statistics().waitsCut, row.isCut ? 1U : 0U) << row.why;
        EXPECT_EQ(rig.wire->now() - before < WireTime(310), row.isCut) << row.why;
    }
}

// Full waits that were asked for, and counted replies, tell nothing of how the adapter keeps to the shorter one.
TEST(CutWait, IsLearntFromPlainRepliesAlone)
{
    for (char const* givenBack : {"OK", "?"}) {
        ChannelRig obeying;
        hasten(obeying);
        obeying.wire->on("ATST64", givenBack);
        for (char const* request : {"010D", "0105"}) {
            std::string const line = "7E80341" + std::string(request + 2) + "20";
            obeying.wire->on(request, saidSlowly(line, 102)).on(request, saidSlowly(line, 400));
            obeying.ask(request);
        }
        obeying.wire->on("010F", saidSlowly("7E803410F20\r7E903410F20", 150));
        obeying.ask("010F");
        EXPECT_THAT(obeying.wire->takeCommands(), Not(Contains(" "))) << givenBack;
    }

    ChannelRig deaf;
    bringUpDeaf(deaf);
    deaf.channel.onConnected();
    deaf.wire->on("010C", saidSlowly("7E804410C1AF8\r7E904410C1AF9", 400))
        .on("03", saidSlowly("7E8024300\r7E9024300", 400));
    deaf.wire->on("010C2", "7E804410C1AF8\r7E904410C1AF9");
    for (int i = 0; i < 3; ++i) {
        deaf.ask("010C");
    }
    deaf.ask("03");
    EXPECT_THAT(deaf.wire->takeCommands(), ElementsAre("010C", " ", "010C", " ", "010C2", "03", " "));
}

TEST(CutWait, IsNeverOfAnAddressNorOfARequestThatChangesSomething)
{
    ChannelRig rig;
    bringUpDeaf(rig);
    rig.wire->on("0901", saidSlowly("7E803490105\r7E903490105", 400)).on("04", saidSlowly("7E80144\r7E90144", 400));
    {
        AddressedModule const engine(rig.channel, 0x7E8);
        rig.ask("0901");
    }
    rig.ask("04");
    EXPECT_THAT(rig.wire->takeCommands(), Not(Contains(" ")));
    struct SentTap : obd::IConnectionLogger
    {
        void onDataSent(std::vector<unsigned char> const& data) override { sent.append(data.begin(), data.end()); }
        void onDataReceived(std::vector<unsigned char> const& /*data*/) override {}
        std::string sent;
    } tap;
    rig.channel.addLogger(&tap);
    rig.ask("0901");
    EXPECT_EQ(tap.sent, "0901\r ") << "loggers see the character, too";
    rig.channel.removeLogger(&tap);
}

// The way to the adapter is no slowness of it.
TEST(CutWait, IsNotGivenUpForALongWay)
{
    ChannelRig rig(nullptr, {.port = {}, .latency = WireTime(200)});
    bringUpDeaf(rig);
    rig.wire->onInterrupt({{"STOPPED\r\r>", WireTime(340)}});
    rig.wire->on("03", saidSlowly("7E8024300\r7E9024300", 800));
    for (int i = 0; i < 4; ++i) {
        rig.ask("03", 3000);
    }
    auto const sent = rig.wire->takeCommands();
    EXPECT_EQ(std::count(sent.begin(), sent.end(), " "), 4);
}

} // namespace

} // namespace velmora
