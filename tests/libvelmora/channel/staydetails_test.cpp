// What becomes of addresses and settings where something goes wrong in between.

#include "libvelmora/channel/returnnote.h"
#include "tests/libvelmora/channel/channelrig.h"
#include "tests/libvelmora/channel/timedreplies.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using test::ChannelRig;
using test::saidCounted;
using test::saidPlainly;
using test::saidSlowly;
using test::speedLine;
using testing::Contains;
using testing::ElementsAre;
using testing::Not;
using testing::Optional;
using Bits = support::ScriptedWire::Reply;

RequestAddress const bodyComputer{.header = "7B3", .reply = "7BB", .stays = true};
RequestAddress const flowing{
    .header = "7B3", .reply = "7BB", .flowHeader = "7B3", .flowData = "300000", .waitMs = 600, .stays = true};

std::vector<std::string> sentTo(ChannelRig& rig, RequestAddress const& address, std::string const& request)
{
    AddressedModule const scope(rig.channel, address);
    rig.wire->onDefault(request, "NO DATA");
    rig.ask(request);
    return rig.wire->takeCommands();
}

TEST(ReturnNote, HoldsAllThatIsToBeGivenBackInItsOrder)
{
    testsupport::TemporaryFolder const folder;
    ChannelRig rig(nullptr, {.port = "COM9", .returns = folder.path() / "adapters.txt"});
    rig.connect();
    sentTo(rig, bodyComputer, "222801");
    EXPECT_EQ(folder.read("adapters.txt"), "COM9\t6\tATCRA\tATSH7DF\n");
    std::filesystem::remove(folder.path() / "adapters.txt");
    sentTo(rig, {.header = "7B4", .reply = "7BC", .stays = true}, "222801");
    EXPECT_EQ(folder.read("adapters.txt"), "") << "nothing more to be given back";
    sentTo(rig, flowing, "222801");
    EXPECT_EQ(folder.read("adapters.txt"), "COM9\t6\tATFCSM0\tATCRA\tATSH7DF\tATST64\n");
    rig.wire->on("010C", speedLine);
    rig.ask("010C"); // which goes to all
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATFCSM0", "ATCRA", "ATSH7DF", "ATST64", "010C"));
    EXPECT_EQ(ReturnNotes(folder.path() / "adapters.txt").find("COM9")->commands.size(), 4U) << "up to the end";
    rig.ask("ATLP", 10);
    EXPECT_FALSE(std::filesystem::exists(folder.path() / "adapters.txt"));
}

TEST(ReturnNote, StaysWhereTheLinkWasGivenUp)
{
    testsupport::TemporaryFolder const folder;
    ReturnNotes const notes(folder.path() / "adapters.txt");
    {
        ChannelRig rig(nullptr, {.port = "COM9", .returns = folder.path() / "adapters.txt"});
        rig.connect();
        sentTo(rig, bodyComputer, "222801");
        rig.wire->on("ATSH7DF", "?");
        rig.ask("010C");
        EXPECT_FALSE(rig.channel.isValid());
    }
    EXPECT_TRUE(notes.find("COM9"));
    auto const wire = std::make_shared<support::ScriptedWire>();
    FastChannel next(wire, {.port = "COM9", .returns = folder.path() / "adapters.txt"});
    wire->on("ATDPN", "?").on("ATCRA", "?");
    test::speak(next, "ATI", 1000);
    EXPECT_THAT(wire->takeCommands(), ElementsAre("ATDPN", "ATDPN", "ATCRA", "ATAR", "ATI"))
        << "of which bus it is nobody tells";
    EXPECT_FALSE(notes.find("COM9"));
}

TEST(ReturnNote, IsKeptForAnAdapterThatDoesNotAnswer)
{
    testsupport::TemporaryFolder const folder;
    ReturnNotes const notes(folder.path() / "adapters.txt");
    for (char const* const silent : {"ATDPN", "ATCRA"}) {
        notes.put("COM9", {6, {"ATCRA", "ATSH7DF"}});
        ChannelRig rig(nullptr, {.port = "COM9", .returns = folder.path() / "adapters.txt"});
        rig.wire->on("ATDPN", "A6"); // in front of it stands another one
        rig.wire->setSilent(std::string(silent) == "ATDPN");
        rig.wire->on("ATCRA", Bits{});
        rig.ask("ATI", 300);
        EXPECT_TRUE(notes.find("COM9")) << silent;
        EXPECT_THAT(rig.wire->takeCommands(), Not(Contains("ATSH7DF")));
    }
    notes.put("COM9", {0, {"ATCP18", "ATSHDB33F1", "ATAT1"}});
    ChannelRig rig(nullptr, {.port = "COM9", .returns = folder.path() / "adapters.txt"});
    rig.ask("ATI");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATDPN", "ATAT1", "ATI")) << "the bus of that time is not known";
}

TEST(AddressRestored, ByAnotherCommandOrByAnAdapterThatWasWoken)
{
    ChannelRig old;
    old.connect();
    old.wire->on("ATCRA", "?").on("221E1C", "7E905621E1C0320");
    EXPECT_THAT(sentTo(old, {.header = "7E1", .reply = "7E9"}, "221E1C"),
                ElementsAre("ATSH7E1", "ATCRA7E9", "221E1C", "ATCRA", "ATAR", "ATSH7DF"));
    EXPECT_TRUE(old.channel.isValid());
    ChannelRig asleep;
    asleep.connect();
    asleep.wire->on("010C", speedLine).on("ATSH7DF", Bits{}).on("ATSH7DF", "OK");
    AddressedModule const engine(asleep.channel, 0x7E8);
    EXPECT_THAT(asleep.ask("010C", 5000), Optional(speedLine));
    EXPECT_THAT(asleep.wire->takeCommands(), ElementsAre("ATSH7E0", "010C", "ATSH7DF", "ATI", "ATSH7DF"));
    EXPECT_TRUE(asleep.channel.isValid());
}

TEST(AddressRestored, AtTheEndThoughItCouldNotBeBefore)
{
    auto const wire = std::make_shared<support::ScriptedWire>();
    {
        ChannelRig rig;
        FastChannel channel(wire, {});
        wire->on("ATI", "ELM327 v1.5").on("ATDPN", "A6").on("0100", "7E8064100BE3EA813").on("010C", speedLine);
        for (char const* command : {"ATI", "ATE0", "ATTP6", "0100", "ATDPN", "ATH1"}) {
            test::speak(channel, command, 1000);
        }
        channel.onConnected();
        wire->on("ATSH7DF", "?").on("ATSH7DF", "?").on("ATSH7DF", "OK");
        AddressedModule const engine(channel, 0x7E8);
        test::speak(channel, "010C", 1500);
        EXPECT_TRUE(channel.adapterFails());
        wire->takeCommands();
    }
    EXPECT_THAT(wire->takeCommands(), ElementsAre("ATI", "ATSH7DF"));
    EXPECT_FALSE(wire->isUp()) << "and then it is left";
}

TEST(RefusedAddress, OfTheOneBeforeEndsTheLink)
{
    ChannelRig rig;
    rig.connect();
    sentTo(rig, flowing, "222801");
    rig.wire->on("ATFCSM0", "?");
    AddressedModule const scope(rig.channel, {.header = "7E1", .reply = "7E9", .stays = true});
    rig.ask("221E1C");
    EXPECT_FALSE(rig.channel.isValid()) << "the other module would be heard in its place";
    auto const sent = rig.wire->takeCommands();
    EXPECT_THAT(sent, Contains("ATFCSM0"));
    EXPECT_THAT(sent, testing::AllOf(Not(Contains("ATSH7E1")), Not(Contains("221E1C"))));
}

TEST(RefusedAddress, OfSomebodySaysNothingOfModules)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("ATCRA7BB", "?").on("010C", speedLine);
    for (int i = 0; i < 3; ++i) {
        AddressedModule const scope(rig.channel, {.header = "7B3", .reply = "7BB"});
        EXPECT_THAT(rig.ask("222801"), Optional(std::string("?")));
        EXPECT_EQ(rig.channel.refusedAddress(), "ATCRA7BB");
    }
    EXPECT_EQ(rig.channel.refusedAddress(), "") << "which belongs to the scope";
    rig.wire->takeCommands();
    AddressedModule const engine(rig.channel, 0x7E8);
    rig.ask("010C");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATSH7E0", "010C", "ATSH7DF"));
}

TEST(ResetInBetween, TakesAllBackThatTheAdapterForgot)
{
    ChannelRig rig;
    rig.connect();
    sentTo(rig, bodyComputer, "222801");
    rig.wire->on("222801", "LV RESET\r\r>\r\rELM327 v1.5\r\r>").on("222801", "7BB04622801AA");
    sentTo(rig, bodyComputer, "222801"); // told before
    EXPECT_THAT(sentTo(rig, bodyComputer, "222801"), ElementsAre("222801", "ATE0", "ATL0", "ATS0", "ATST64", "ATTP6",
                                                                 "ATH1", "ATSH7B3", "ATCRA7BB", "222801"));
    EXPECT_EQ(rig.met(Habit::StaleReply), 0U) << "its banner is no stray reply";
    EXPECT_EQ(rig.met(Habit::EmptyReply), 0U);
}

TEST(ResetInBetween, OfACountedRequestIsAskedPlainlyOnce)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", saidPlainly(speedLine)).on("010C1", "ELM327 v1.5").on("010C1", saidCounted(speedLine));
    AddressedModule const engine(rig.channel, 0x7E8);
    rig.ask("010C");
    rig.ask("010C");
    rig.wire->takeCommands();
    EXPECT_THAT(rig.ask("010C", 5000), Optional(speedLine));
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATSH7E0", "010C1", "ATE0", "ATL0", "ATS0", "ATST64", "ATTP6",
                                                      "ATH1", "ATSH7E0", "010C", "ATSH7DF"));
    EXPECT_EQ(rig.met(Habit::UnfinishedCount), 0U);
    rig.ask("010C");
    rig.wire->takeCommands();
    rig.ask("010C");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATSH7E0", "010C1", "ATSH7DF")) << "learnt anew from then on";
}

TEST(ResetInBetween, WaitsForTheBannerBehindLowVoltage)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", Bits{{"LV RESET\r\r>"}, {"\r\rELM327 v1.5\r\r>", WireTime(500)}}).on("010C", speedLine);
    WireTime const start = rig.wire->now();
    EXPECT_THAT(rig.ask("010C", 5000), Optional(speedLine));
    EXPECT_GE(rig.wire->now() - start, WireTime(500));
    rig.ask("ATRV");
    EXPECT_EQ(rig.met(Habit::StaleReply), 0U);
}

TEST(ResetInBetween, UnlearnsWaitsAndCounts)
{
    ChannelRig rig;
    rig.wire->on("0100", saidSlowly("7E8064100BE3EA813", 400));
    rig.bringUp();
    rig.ask("0100");
    rig.channel.onConnected();
    rig.wire->on("010C", saidSlowly(speedLine, 400)).on("010C1", saidCounted(speedLine));
    rig.ask("010C");
    rig.ask("010C");
    rig.wire->on("03", "LV RESET").on("03", saidSlowly("7E8024300", 400));
    rig.wire->takeCommands();
    rig.ask("03", 5000);
    EXPECT_THAT(rig.wire->takeCommands(),
                ElementsAre("03", "ATE0", "ATL0", "ATS0", "ATST64", "ATTP6", "ATH1", "03", "ATST19"));
    rig.ask("010C");
    auto const sent = rig.wire->takeCommands();
    EXPECT_EQ(sent.front(), "010C") << "which is counted no more";
}

TEST(ResetInBetween, IsALostLinkWithinAMinute)
{
    for (int const pause : {59999, 60000}) {
        ChannelRig rig;
        rig.connect();
        rig.wire->on("010C", "ELM327 v1.5").on("010C", speedLine).on("010C", "ELM327 v1.5").on("010C", speedLine);
        rig.ask("010C");
        WireTime const reset = rig.wire->now() - WireTime(7 * 5); // when the banner was heard
        rig.wire->read(reset + WireTime(pause) - WireTime(5));
        rig.ask("010C");
        EXPECT_EQ(rig.channel.isValid(), pause == 60000) << pause;
        EXPECT_EQ(rig.channel.adapterResets(), pause != 60000);
    }
}

TEST(Banner, OfACommandThatAsksForItIsNoReset)
{
    for (char const* command : {"ATZ", "ATWS", "ATI", "AT@1", "STI", "ATD"}) {
        ChannelRig rig;
        rig.connect();
        rig.wire->on(command, "ELM327 v1.5");
        EXPECT_THAT(rig.ask(command), Optional(std::string("ELM327 v1.5")));
        EXPECT_EQ(rig.met(Habit::SettingsLost), 0U) << command;
    }
    ChannelRig rig;
    rig.connect();
    rig.wire->on("ATRV", "ELM327 v1.5").on("ATRV", "12.6V");
    EXPECT_THAT(rig.ask("ATRV"), Optional(std::string("12.6V")));
    EXPECT_EQ(rig.met(Habit::SettingsLost), 1U);
}

TEST(MonitoredReply, IsToldToWhoAddressedItAlone)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("ATMA", Bits{{"7302110\r"}});
    {
        AddressedModule const scope(rig.channel, bodyComputer);
        rig.ask("ATMA", 300);
        rig.ask("ATRV");
        EXPECT_THAT(rig.channel.takeReply().lines, ElementsAre("7302110"));
    }
    EXPECT_TRUE(rig.channel.takeReply().lines.empty());
    rig.wire->on("222801", "7BB04622801AA\r7BB03");
    AddressedModule const scope(rig.channel, bodyComputer);
    rig.ask("222801");
    AddressedReply const reply = rig.channel.takeReply();
    EXPECT_TRUE(reply.answered);
    EXPECT_TRUE(reply.broken);
    EXPECT_EQ(reply.error, "");
}

} // namespace

} // namespace velmora
