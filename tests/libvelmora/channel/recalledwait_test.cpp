// How an adapter that listens long behind replies is brought to listen less from the first request of a second visit.

#include "libvelmora/channel/learntstore.h"
#include "tests/libvelmora/channel/channelrig.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>

namespace velmora {

namespace {

using test::ChannelRig;
using testing::ElementsAre;

support::ScriptedWire::Reply heldBack(std::string const& lines, int waitMs)
{
    return {{lines + "\r", WireTime(20)}, {"\r>", WireTime(waitMs)}};
}

std::string const masksOfTwo = "7E8064100BE3EA813\r7E906410080000001";

class RecalledWait : public testing::Test
{
protected:
    // An adapter that waits so long behind the replies to 0100, one after the other.
    std::unique_ptr<ChannelRig> visit(std::vector<int> const& waitsMs)
    {
        auto rig = std::make_unique<ChannelRig>(std::make_shared<LearntStore>(m_folder.path() / "learnt.toml"));
        for (int const wait : waitsMs) {
            rig->wire->on("0100", heldBack(masksOfTwo, wait));
        }
        rig->wire->on("0120", heldBack("7E8064120A007F011\r7E906412080000001", waitsMs.back()));
        rig->wire->onInterrupt({{"STOPPED\r\r>", WireTime(4)}});
        return rig;
    }
    // As far as the first requests of the discovery, and to the end of the visit.
    void first(std::vector<int> const& waitsMs)
    {
        auto const rig = visit(waitsMs);
        rig->bringUp();
        rig->wire->on("0140", heldBack("7E8064140A007F011\r7E906414080000001", waitsMs.back()));
        for (char const* request : {"0100", "0120", "0140"}) {
            rig->ask(request);
        }
        rig->channel.onConnected();
    }
    std::string learnt() const
    {
        std::ifstream in(m_folder.path() / "learnt.toml");
        return {std::istreambuf_iterator<char>(in), {}};
    }

    testsupport::TemporaryFolder m_folder;
};

TEST_F(RecalledWait, OfAnAdapterThatObeysIsSetForTheFirstRequestAlone)
{
    first({400, 400, 102});
    EXPECT_THAT(learnt(), testing::HasSubstr("wait = 25"));
    auto const rig = visit({102, 400, 102});
    WireTime const before = rig->wire->now();
    rig->bringUp();
    EXPECT_LT(rig->wire->now() - before, WireTime(200));
    EXPECT_THAT(rig->wire->takeCommands(), ElementsAre("ATI", "ATE0", "ATL0", "ATS0", "ATST64", "ATST19", "ATTP6",
                                                       "0100", "ATDPN", "ATH1", "ATST64"));
    rig->ask("0100");
    rig->ask("0120");
    EXPECT_THAT(rig->wire->takeCommands(), ElementsAre("0100", "ATST19", "0120"))
        << "who is there was asked with all of the wait";
}

TEST_F(RecalledWait, OfAnAdapterThatDoesNotObeyIsCutFromTheFirstRequestOn)
{
    first({400});
    EXPECT_THAT(learnt(), testing::HasSubstr("cut = true"));
    auto const rig = visit({400});
    WireTime const before = rig->wire->now();
    rig->bringUp();
    EXPECT_LT(rig->wire->now() - before, WireTime(250));
    EXPECT_THAT(rig->wire->takeCommands(), ElementsAre("ATI", "ATE0", "ATL0", "ATS0", "ATST64", "ATST19", "ATTP6",
                                                       "0100", " ", "ATDPN", "ATH1", "ATST64"));
    EXPECT_THAT(rig->ask("0100"), testing::Optional(std::string("7E8064100BE3EA8137E906410080000001")));
    rig->ask("0120");
    EXPECT_THAT(rig->wire->takeCommands(), ElementsAre("0100", "ATST19", "0120", " "));
    EXPECT_EQ(rig->met(Habit::TrailingError), 0U);
}

TEST_F(RecalledWait, IsNotCutAnyMoreOnceTheAdapterObeys)
{
    first({400});
    auto const rig = visit({102, 400, 102});
    rig->bringUp();
    rig->ask("0100");
    rig->ask("0120");
    EXPECT_THAT(rig->wire->takeCommands(), testing::Not(testing::Contains(" ")));
}

TEST_F(RecalledWait, IsGivenBackWhereTheVehicleSaysNothingInThatTime)
{
    first({400});
    ChannelRig rig(std::make_shared<LearntStore>(m_folder.path() / "learnt.toml"));
    rig.wire->on("0100", "NO DATA").on("0100", heldBack(masksOfTwo, 400));
    rig.bringUp();
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATI", "ATE0", "ATL0", "ATS0", "ATST64", "ATST19", "ATTP6",
                                                      "0100", "ATST64", "ATTP0", "0100", "ATDPN", "ATH1"));
}

TEST_F(RecalledWait, OfAFileThatTellsNonsenseIsNone)
{
    for (char const* text : {"wait = 9999", "wait = -3", "wait = 'long'"}) {
        std::ofstream(m_folder.path() / "learnt.toml") << "[adapter.x]\nprotocol = 6\n" << text << "\n";
        EXPECT_EQ(LearntStore(m_folder.path() / "learnt.toml").wait("x").steps, 0U) << text;
    }
    std::ofstream(m_folder.path() / "learnt.toml") << "[adapter.' ELM327V1.5']\nprotocol = 6\nwait = 2\n";
    auto const rig = visit({102});
    rig->bringUp();
    EXPECT_THAT(rig->wire->takeCommands(), testing::Contains("ATST19")) << "never under 102 ms";
}

} // namespace

} // namespace velmora
