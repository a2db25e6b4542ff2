// When counts are unlearnt, and where there are none.

#include "tests/libvelmora/channel/channelrig.h"
#include "tests/libvelmora/channel/timedreplies.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using test::ChannelRig;
using test::learnSpeed;
using test::saidPlainly;
using testing::Contains;
using testing::ElementsAre;
using testing::Not;

TEST(Counts, AreUnlearntByWhatChangesTheAdapterAlone)
{
    struct Row
    {
        char const* command;
        bool unlearns;
    };
    for (auto const& [command, unlearns] :
         {Row{"ATRV", false}, Row{"ATI", false}, Row{"ATCRA7E8", true}, Row{"ATH1", true}, Row{"ATD0", true}}) {
        ChannelRig rig;
        rig.connect();
        learnSpeed(rig);
        rig.ask(command);
        rig.wire->takeCommands();
        rig.ask("010C");
        EXPECT_THAT(rig.wire->takeCommands(), ElementsAre(unlearns ? "010C" : "010C1")) << command;
    }
}

TEST(Counts, AreThoseOfTheirAddress)
{
    ChannelRig rig;
    rig.connect();
    learnSpeed(rig);
    auto const sentTo = [&rig](RequestAddress const& address) {
        AddressedModule const scope(rig.channel, address);
        rig.ask("010C");
        auto const sent = rig.wire->takeCommands();
        return *std::find_if(sent.begin(), sent.end(), [](auto const& each) { return each.starts_with("010C"); });
    };
    RequestAddress const engine{.header = "7E0"};
    RequestAddress const trunk{.header = "6F1", .extended = "07"};
    RequestAddress const door{.header = "6F1", .extended = "08"};
    EXPECT_EQ(sentTo(engine), "010C");
    EXPECT_EQ(sentTo(engine), "010C");
    EXPECT_EQ(sentTo(engine), "010C1");
    rig.wire->on("010C", "607F104410C1AF8").on("010C", "607F104410C1AF8");
    for (int i = 0; i < 2; ++i) {
        sentTo(trunk);
    }
    EXPECT_EQ(sentTo(trunk), "010C1");
    EXPECT_EQ(sentTo(door), "010C");
}

TEST(Counts, OfASilentVehicleAreNone)
{
    ChannelRig rig;
    rig.bringUp(); // not yet connected
    learnSpeed(rig);
    rig.ask("010C");
    EXPECT_THAT(rig.wire->takeCommands(), Not(Contains("010C1")));
    ChannelRig headersOff;
    headersOff.ask("ATE0");
    headersOff.channel.onConnected();
    headersOff.wire->on("010C", saidPlainly("41 0C 1A F8"));
    for (int i = 0; i < 3; ++i) {
        headersOff.ask("010C");
    }
    EXPECT_THAT(headersOff.wire->takeCommands(), ElementsAre("ATE0", "010C", "010C", "010C"));
    ChannelRig off(nullptr, {.port = {}, .counting = false});
    off.connect();
    learnSpeed(off);
    off.ask("010C");
    EXPECT_THAT(off.wire->takeCommands(), ElementsAre("010C"));
}

} // namespace

} // namespace velmora
