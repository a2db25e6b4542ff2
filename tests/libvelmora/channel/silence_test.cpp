// Adapters that say nothing any more, and those that only seem to.

#include "libvelmora/channel/fastchannel.h"
#include "tests/libvelmora/channel/channelrig.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using test::ChannelRig;
using testing::AllOf;
using testing::Contains;
using testing::Ge;
using testing::Le;
using testing::Optional;
using ScriptedReply = support::ScriptedWire::Reply;

struct Asked
{
    char const* text;
    int timeoutMs;
};

// How long it is asked until it is taken for gone; nothing if it never is.
std::optional<long> millisUntilGone(ChannelRig& rig, Asked const& asked)
{
    WireTime const start = rig.wire->now();
    for (int i = 0; i < 100 && rig.channel.isValid(); ++i) {
        rig.ask(asked.text, asked.timeoutMs);
    }
    EXPECT_EQ(rig.channel.isValid(), !rig.channel.adapterGone());
    return rig.channel.isValid() ? std::nullopt : std::optional((rig.wire->now() - start).count());
}

TEST(Silence, AnAdapterWithoutAByteForSecondsIsGoneWhateverItIsAsked)
{
    for (Asked const& asked : {Asked{"ATRV", 500}, Asked{"ATSTFF", 200}, Asked{"010C", 1500}, Asked{"0902", 5000}}) {
        ChannelRig rig;
        rig.connect();
        rig.wire->setSilent(true);
        EXPECT_THAT(millisUntilGone(rig, asked), Optional(AllOf(Ge(8000), Le(11500)))) << asked.text;
        EXPECT_THAT(rig.wire->takeCommands(), Contains("ATI").Times(Ge(2))) << "it was asked whether it is there";
        EXPECT_TRUE(rig.channel.adapterFails());
        EXPECT_TRUE(rig.channel.statistics().adapterSilent);
        EXPECT_FALSE(rig.channel.adapterResets());
        rig.ask("ATRV");
        EXPECT_THAT(rig.wire->takeCommands(), testing::IsEmpty()) << "nothing more is sent";
    }
}

// The first request may be a search without a word, which takes its time. What follows is no search.
TEST(Silence, TheHostsLimitOfASearchIsWaitedForButNotTwice)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->setSilent(true);
    rig.ask("ATRV", 500);
    EXPECT_THAT(millisUntilGone(rig, {"0100", 10000}), Optional(Le(10000)));
    ChannelRig found; // its bus has spoken
    found.connect();
    found.wire->setSilent(true);
    EXPECT_THAT(millisUntilGone(found, {"0100", 10000}), Optional(Le(10000)));
    ChannelRig searching;
    for (char const* command : {"ATI", "ATE0", "ATST64", "ATTP0"}) {
        searching.ask(command);
    }
    searching.wire->setSilent(true);
    EXPECT_THAT(millisUntilGone(searching, {"0100", 10000}), Optional(AllOf(Ge(15000), Le(17000))));
}

TEST(Silence, ASlowSearchWithoutAWordIsNoSilence)
{
    ChannelRig rig;
    for (char const* command : {"ATI", "ATE0", "ATST64", "ATTP0"}) {
        rig.ask(command);
    }
    rig.wire->on("0100", ScriptedReply{{"7E8064100BE3EA813\r\r>", WireTime(14000)}});
    rig.wire->onDefault("ATI", "ELM327 v1.5");
    EXPECT_EQ(rig.ask("0100", 10000), std::nullopt);
    EXPECT_THAT(rig.ask("ATRV", 500), Optional(std::string("OK"))) << "the late prompt was waited for";
    EXPECT_TRUE(rig.channel.isValid());
}

// A request to one module is not refused by an adapter that says nothing, and it is the silence that is told.
TEST(Silence, AnAddressThatIsNotTakenInSilenceIsNoRefusal)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->setSilent(true);
    AddressedModule const scope(rig.channel, {.header = "7B3", .reply = "7BB"});
    rig.ask("221E1C");
    EXPECT_EQ(rig.channel.refusedAddress(), "");
    EXPECT_TRUE(rig.channel.adapterFails());
    EXPECT_TRUE(rig.channel.adapterGone());
}

TEST(Silence, WhoeverSaysAnythingIsThere)
{
    for (char const* word : {"\r", "?", "."}) { // never a prompt
        ChannelRig rig;
        rig.connect();
        for (char const* command : {"ATRV", "ATI"}) {
            for (int i = 0; i < 2; ++i) { // the last one told stays, in place of what connected
                rig.wire->on(command, ScriptedReply{{word}});
            }
        }
        rig.ask("ATI", 500);
        EXPECT_EQ(millisUntilGone(rig, {"ATRV", 500}), std::nullopt) << word;
    }
}

TEST(Silence, WhoPausesForSomeSecondsIsWelcomeBack)
{
    ChannelRig rig;
    rig.connect();
    for (int i = 0; i < 3; ++i) { // what was silent before does not count
        rig.wire->setSilent(true);
        WireTime const start = rig.wire->now();
        while (rig.channel.isValid() && rig.wire->now() - start < WireTime(5000)) {
            EXPECT_EQ(rig.ask("ATRV", 500), std::nullopt);
        }
        rig.wire->setSilent(false);
        EXPECT_THAT(rig.ask("ATRV", 500), Optional(std::string("OK")));
    }
    EXPECT_TRUE(rig.channel.isValid());
}

} // namespace

} // namespace velmora
