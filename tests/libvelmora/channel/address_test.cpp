// Requests to one module: the address is set and taken back around each of them, and never stays.

#include "simulator/simulation.h"
#include "tests/libvelmora/channel/channelrig.h"
#include "tests/support/wire/peerwire.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <thread>

namespace velmora {

namespace {

using test::ChannelRig;
using testing::ElementsAre;
using testing::ElementsAreArray;
using testing::Optional;
using Said = support::ScriptedWire::Reply;

std::string const rpmOfEngine = "7E804410C1AF8";

TEST(RequestAddress, AModuleIsAddressedInsideTheExchangeOnly)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", rpmOfEngine).on("010D", Said{});
    {
        AddressedModule const engine(rig.channel, 0x7E8);
        rig.ask("010C");
        EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATSH7E0", "010C", "ATSH7DF"));
        rig.ask("010D");
    }
    rig.ask("010C");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATSH7E0", "010D", "ATI", "ATSH7DF", "010C"))
        << "after a lost reply, too";
    rig.wire->on("ATSH7DF", "?");
    {
        AddressedModule const engine(rig.channel, 0x7E8);
        rig.ask("010C");
    }
    EXPECT_FALSE(rig.channel.isValid()) << "an address that stays would hide the other modules";
}

struct HeaderCase
{
    char const* why;
    char protocol;
    RequestAddress address;
    std::vector<std::string> set;
    std::vector<std::string> restore;
};

HeaderCase const headerCases[] = {
    {"a pair of the standard", '6', {.header = "7E1", .reply = "7E9"}, {"ATSH7E1", "ATCRA7E9"}, {"ATCRA", "ATSH7DF"}},
    {"another pair, with flow control and patience",
     '6',
     {.header = "7B3", .reply = "7BB", .flowHeader = "7B3", .flowData = "300000", .waitMs = 600},
     {"ATSH7B3", "ATCRA7BB", "ATFCSH7B3", "ATFCSD300000", "ATFCSM1", "ATST93"},
     {"ATFCSM0", "ATCRA", "ATSH7DF", "ATST64"}},
    {"an address byte",
     '6',
     {.header = "6F1", .reply = "607", .extended = "07", .tester = "F1"},
     {"ATSH6F1", "ATCEA07", "ATTAF1", "ATCRA607"},
     {"ATCEA", "ATCRA", "ATSH7DF"}},
    {"whoever answers",
     '6',
     {.header = "700", .reply = "7XX"},
     {"ATSH700", "ATCF700", "ATCM700"},
     {"ATCRA", "ATSH7DF"}},
    {"29 bits",
     '7',
     {.header = "18DADBF1", .reply = "18DAF1DB"},
     {"ATSHDADBF1", "ATCRA18DAF1DB"},
     {"ATCRA", "ATSHDB33F1"}},
    {"29 bits of another priority", '7', {.header = "17FC007B"}, {"ATCP17", "ATSHFC007B"}, {"ATCP18", "ATSHDB33F1"}},
    {"ISO 14230", '5', {.header = "8110F1"}, {"ATSH8110F1"}, {"ATSHC033F1"}},
    {"ISO 9141-2", '3', {.header = "686AF1"}, {"ATSH686AF1"}, {"ATSH686AF1"}},
    {"SAE J1850 PWM", '1', {.header = "C410F1"}, {"ATSHC410F1"}, {"ATSH616AF1"}},
};

TEST(RequestAddress, EachKindIsSetAndTakenBackInItsOrder)
{
    for (HeaderCase const& row : headerCases) {
        ChannelRig rig;
        rig.wire->on("ATDPN", std::string("A") + row.protocol);
        rig.connect();
        rig.ask(std::string("ATTP") + row.protocol);
        rig.wire->takeCommands();
        {
            AddressedModule const scope(rig.channel, row.address);
            rig.ask("221E1C");
            EXPECT_EQ(rig.channel.refusedAddress(), "");
        }
        rig.ask("ATRV");
        std::vector<std::string> expected = row.set;
        expected.emplace_back("221E1C");
        expected.insert(expected.end(), row.restore.begin(), row.restore.end());
        expected.emplace_back("ATRV");
        auto commands = rig.wire->takeCommands();
        std::erase(commands, "ATI");
        commands.erase(std::unique(commands.begin(), commands.end()), commands.end()); // asked twice for nothing left
        EXPECT_THAT(commands, ElementsAreArray(expected)) << row.why;
        EXPECT_TRUE(rig.channel.isValid()) << row.why;
    }
}

TEST(RequestAddress, WhereItCanNotGoARequestIsNotSent)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("ATFCSH7B3", "?").on("ATCRA", "?");
    {
        AddressedModule const scope(rig.channel,
                                    {.header = "7B3", .reply = "7BB", .flowHeader = "7B3", .flowData = "30"});
        EXPECT_THAT(rig.ask("221E1C"), Optional(std::string("?")));
        EXPECT_EQ(rig.channel.refusedAddress(), "ATFCSH7B3");
    }
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATSH7B3", "ATCRA7BB", "ATFCSH7B3", "ATCRA", "ATAR", "ATSH7DF"));
    for (RequestAddress const& wrong : {RequestAddress{.header = "18DADBF1"}, RequestAddress{.header = "7G1"}}) {
        AddressedModule const scope(rig.channel, wrong);
        rig.ask("221E1C");
        EXPECT_EQ(rig.channel.refusedAddress(), "bus");
    }
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre());
}

TEST(RequestAddress, AnAdapterThatKnowsNoHeadersIsAskedByBroadcast)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", rpmOfEngine).on("010C1", rpmOfEngine).on("ATSH7E0", "?");
    AddressedModule const engine(rig.channel, 0x7E8);
    for (int i = 0; i < 3; ++i) {
        EXPECT_THAT(rig.ask("010C"), Optional(rpmOfEngine));
    }
    EXPECT_THAT(rig.wire->takeCommands(),
                ElementsAre("ATSH7E0", "ATSH7DF", "010C", "ATSH7E0", "ATSH7DF", "010C", "010C1"));
}

TEST(RequestAddress, AnOtherThreadsRequestGoesToAll)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", rpmOfEngine).on("0100", "7E8064100BE3EA813");
    AddressedModule const engine(rig.channel, 0x7E8);
    rig.ask("010C");
    std::thread([&rig] { rig.ask("0100"); }).join(); // such as what keeps the session alive
    rig.ask("010C");
    EXPECT_THAT(rig.wire->takeCommands(),
                ElementsAre("ATSH7E0", "010C", "ATSH7DF", "0100", "ATSH7E0", "010C", "ATSH7DF"));
}

TEST(RequestAddress, AResetInBetweenSetsItAgain)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("221E1C", "LV RESET").on("221E1C", "7E905621E1C0320");
    AddressedModule const scope(rig.channel, {.header = "7E1", .reply = "7E9"});
    EXPECT_THAT(rig.ask("221E1C", 5000), Optional(std::string("7E905621E1C0320")));
    auto const commands = rig.wire->takeCommands();
    EXPECT_THAT(std::vector(commands.end() - 6, commands.end()),
                ElementsAre("ATH1", "ATSH7E1", "ATCRA7E9", "221E1C", "ATCRA", "ATSH7DF"));
}

// Ctrl-C, or a deadline, in the middle of a request that the adapter is still at.
TEST(RequestAddress, WhoIsInterruptedStillLeavesNoAddressBehind)
{
    auto const wire = std::make_shared<support::ScriptedWire>();
    {
        FastChannel channel(wire, {});
        wire->on("ATI", "ELM327 v1.5")
            .on("ATI", "STOPPED")
            .on("ATI", "ELM327 v1.5")
            .on("ATDPN", "A6")
            .on("0100", "7E8064100BE3EA813")
            .on("010C", Said{});
        for (char const* command : {"ATI", "ATE0", "ATTP6", "0100", "ATDPN", "ATH1"}) {
            test::speak(channel, command, 1000);
        }
        channel.onConnected();
        wire->takeCommands();
        AddressedModule const engine(channel, 0x7E8);
        std::string const request = "010C\r";
        channel.send({request.begin(), request.end()});
        channel.invalidate();
        std::vector<unsigned char> bytes;
        EXPECT_FALSE(channel.receive(bytes, 1000));
    }
    EXPECT_THAT(wire->takeCommands(), ElementsAre("ATSH7E0", "010C", "ATI", "ATI", "ATSH7DF"));
}

// The gearbox of a simulated car, a body module of another pair, and one with an address byte whose long reply comes in
// frames that hold a byte less.
TEST(RequestAddress, ReachesEveryModuleOfASimulatedCar)
{
    auto const wire =
        std::make_shared<support::PeerWire>(obdsim::simulate({"petrol-can11-modules", "elm327-v2.1", {}}));
    FastChannel channel(wire, {});
    for (char const* command : {"ATI", "ATE0", "ATL0", "ATS0", "ATST64", "ATTP0"}) {
        test::speak(channel, command, 1000);
    }
    test::speak(channel, "0100", 10000);
    test::speak(channel, "ATDPN", 1000);
    test::speak(channel, "ATH1", 1000);
    channel.onConnected();
    auto const askAt = [&channel](RequestAddress const& address, char const* request) {
        AddressedModule const scope(channel, address);
        return test::speak(channel, request, 1500).value_or("silent");
    };
    EXPECT_EQ(askAt({.header = "743", .reply = "763", .flowHeader = "743", .flowData = "300000"}, "22F187"),
              "763100E62F187323834"
              "7632130302D53313030"
              "7632234000000000000");
    EXPECT_EQ(askAt({.header = "6F1",
                     .reply = "607",
                     .extended = "07",
                     .tester = "F1",
                     .flowHeader = "6F1",
                     .flowData = "07300000"},
                    "22DDBC"),
              "607100A62DDBC03520160721"
              "11223344000000");
    EXPECT_EQ(test::speak(channel, "22F187", 1500), "NO DATA") << "nothing is left of it";
    EXPECT_THAT(test::speak(channel, "0100", 1500), Optional(testing::StartsWith("7E8064100")));
}

} // namespace

} // namespace velmora
