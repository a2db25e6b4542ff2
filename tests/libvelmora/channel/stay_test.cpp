// An address that stays for several requests: set once, given back before anything else goes out, and after a broken
// link before the first command of the next connection.

#include "tests/libvelmora/channel/channelrig.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <thread>

namespace velmora {

namespace {

using test::ChannelRig;
using testing::ElementsAre;

RequestAddress const body{.header = "7B3", .reply = "7BB", .flowHeader = "7B3", .flowData = "300000", .stays = true};
RequestAddress const gearboxModule{.header = "7E1", .reply = "7E9", .stays = true};
RequestAddress const slow{
    .header = "6F1", .reply = "607", .extended = "07", .tester = "F1", .waitMs = 600, .adaptive = false, .stays = true};
std::string const bodyReply = "7BB04622801AA";

TEST(StayingAddress, IsSetOnceAndGivenBackBeforeAnythingElse)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("222801", bodyReply).on("222802", "7BB04622802AA").on("010C", "7E804410C1AF8");
    for (char const* const request : {"222801", "222802"}) {
        AddressedModule const scope(rig.channel, body); // a scope each: what stays is the adapter's, not the scope's
        rig.ask(request);
    }
    EXPECT_THAT(rig.wire->takeCommands(),
                ElementsAre("ATSH7B3", "ATCRA7BB", "ATFCSH7B3", "ATFCSD300000", "ATFCSM1", "222801", "222802"));
    rig.ask("ATRV"); // the adapter's own answer, which no address changes
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATRV"));
    std::thread([&rig] { rig.ask("010C"); }).join();
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATFCSM0", "ATCRA", "ATSH7DF", "010C"));
}

TEST(StayingAddress, SendsOnlyWhatDiffersFromTheModuleBefore)
{
    ChannelRig rig;
    rig.connect();
    auto const ask = [&rig](RequestAddress const& address, char const* request) {
        AddressedModule const scope(rig.channel, address);
        rig.wire->on(request, "NO DATA");
        rig.ask(request);
        return rig.wire->takeCommands();
    };
    EXPECT_THAT(ask(gearboxModule, "221E1C"), ElementsAre("ATSH7E1", "ATCRA7E9", "221E1C"));
    EXPECT_THAT(ask(slow, "22DDBC"),
                ElementsAre("ATSH6F1", "ATCEA07", "ATTAF1", "ATCRA607", "ATST93", "ATAT0", "22DDBC"));
    EXPECT_THAT(ask(body, "222801"), ElementsAre("ATCEA", "ATAT1", "ATST64", "ATSH7B3", "ATCRA7BB", "ATFCSH7B3",
                                                 "ATFCSD300000", "ATFCSM1", "222801"));
    EXPECT_THAT(ask(gearboxModule, "221E1C"), ElementsAre("ATFCSM0", "ATSH7E1", "ATCRA7E9", "221E1C"));
    rig.ask("ATTP6");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATCRA", "ATSH7DF", "ATTP6"));
}

TEST(StayingAddress, TellsWhatCameBeyondTheCore)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("222801", bodyReply).on("222802", "CAN ERROR").on("222803", "NO DATA").on("ATFCSM1", "?");
    AddressedModule const scope(rig.channel, gearboxModule);
    rig.ask("222801");
    EXPECT_THAT(rig.channel.takeReply().lines, ElementsAre(bodyReply));
    EXPECT_FALSE(rig.channel.takeReply().answered) << "it is told once";
    rig.ask("222802");
    EXPECT_EQ(rig.channel.takeReply().error, "CANERROR");
    rig.ask("222803");
    EXPECT_EQ(rig.channel.takeReply().error, "NODATA");
    rig.wire->takeCommands();
    AddressedModule const other(rig.channel, body);
    rig.ask("222801");
    EXPECT_EQ(rig.channel.refusedAddress(), "ATFCSM1");
    EXPECT_FALSE(rig.channel.takeReply().answered);
    auto const commands = rig.wire->takeCommands();
    EXPECT_THAT(std::vector(commands.end() - 4, commands.end()), ElementsAre("ATFCSM1", "ATFCSM0", "ATCRA", "ATSH7DF"));
}

TEST(StayingAddress, IsGivenBackAtTheEnd)
{
    testsupport::TemporaryFolder folder;
    auto const notes = folder.path() / "adapters.txt";
    ChannelRig rig(nullptr, {.port = "COM9", .returns = notes});
    rig.connect();
    {
        AddressedModule const scope(rig.channel, body);
        rig.ask("222801");
    }
    rig.wire->takeCommands();
    EXPECT_TRUE(std::filesystem::exists(notes));
    std::string const farewell = "ATLP\r";
    rig.channel.send({farewell.begin(), farewell.end()});
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATFCSM0", "ATCRA", "ATSH7DF"));
    EXPECT_FALSE(std::filesystem::exists(notes));
}

// What a first connection leaves behind when its link breaks.
std::vector<std::string> firstCommandsAfterLoss(std::string const& busNow)
{
    testsupport::TemporaryFolder folder;
    ChannelOptions const options{.port = "COM9", .returns = folder.path() / "adapters.txt"};
    struct DeadWire : support::ScriptedWire
    {
        bool resume() override { return false; }
    };
    {
        auto const wire = std::make_shared<DeadWire>();
        FastChannel channel(wire, options);
        wire->on("ATDPN", "A6").on("ATI", "ELM327 v1.5").on("0100", "7E8064100BE3EA813").on("222801", bodyReply);
        for (char const* command : {"ATI", "ATE0", "ATTP6", "0100", "ATDPN", "ATH1"}) {
            test::speak(channel, command, 1000);
        }
        channel.onConnected();
        AddressedModule const scope(channel, body);
        test::speak(channel, "222801", 1000);
        wire->giveUp();
    }
    auto const next = std::make_shared<support::ScriptedWire>();
    next->on("ATDPN", busNow);
    FastChannel channel(next, options);
    test::speak(channel, "ATI", 1000);
    auto commands = next->takeCommands();
    ChannelRig third(nullptr, options);
    third.ask("ATI");
    EXPECT_THAT(third.wire->takeCommands(), ElementsAre("ATI")) << "once is enough";
    return commands;
}

TEST(StayingAddress, IsGivenBackBeforeTheFirstCommandAfterALoss)
{
    auto const same = firstCommandsAfterLoss("A6");
    EXPECT_THAT(same, ElementsAre("ATDPN", "ATFCSM0", "ATCRA", "ATSH7DF", "ATI"));
    EXPECT_THAT(firstCommandsAfterLoss("A3"), ElementsAre("ATDPN", "ATFCSM0", "ATCRA", "ATI"))
        << "a header of the bus before would be worse than none";
}

TEST(StayingAddress, WhatIsMonitoredIsTold)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("ATMA", support::ScriptedWire::Reply{{"7302110\r7445566\r"}});
    rig.wire->on("ATI", "STOPPED").on("ATI", "ELM327 v1.5");
    RequestAddress pattern = gearboxModule;
    pattern.reply = "7XX";
    AddressedModule const scope(rig.channel, pattern);
    EXPECT_EQ(rig.ask("ATMA", 300), std::nullopt);
    rig.ask("ATI");
    auto const lines = rig.channel.takeReply().lines;
    ASSERT_GE(lines.size(), 2U);
    EXPECT_EQ(lines[0], "7302110");
    EXPECT_EQ(lines[1], "7445566");
}

} // namespace

} // namespace velmora
