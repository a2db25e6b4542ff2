// What is kept from visit to visit.

#include "libvelmora/channel/canmessagelist.h"
#include "libvelmora/channel/learntstore.h"
#include "tests/libvelmora/channel/channelrig.h"
#include "tests/libvelmora/channel/timedreplies.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using test::ChannelRig;
using test::learnSpeed;
using test::saidCounted;
using test::saidPlainly;
using test::speedLine;
using testing::Contains;
using testing::ElementsAre;
using testing::Not;

class SecondVisit : public testing::Test
{
protected:
    std::shared_ptr<LearntStore> m_store = std::make_shared<LearntStore>("");
    ChannelOptions const m_options{.port = "COM1"};
    std::string const m_adapter = "COM1 ELM327V1.5";
};

TEST_F(SecondVisit, KnowsWhetherTheAdapterCounts)
{
    struct Row
    {
        char const* counted; // reply to a counted request
        bool once;           // after one that was taken
        bool can;
    };
    for (auto const& [counted, once, can] :
         {Row{"?", false, false}, Row{"?", true, true}, Row{"NO DATA", false, true}}) {
        m_store->forget();
        {
            ChannelRig rig(m_store, m_options);
            rig.connect();
            rig.wire->on("010C", saidPlainly(speedLine));
            if (once) {
                rig.wire->on("010C1", saidCounted(speedLine));
            }
            rig.wire->on("010C1", counted);
            for (int i = 0; i < 5; ++i) {
                rig.ask("010C");
            }
            EXPECT_EQ(rig.channel.statistics().countingOff, std::string(counted) == "?");
        }
        EXPECT_EQ(m_store->canCount(m_adapter), can) << counted;
        ChannelRig second(m_store, m_options);
        second.connect();
        learnSpeed(second);
        second.ask("010C");
        EXPECT_THAT(second.wire->takeCommands(), ElementsAre(can ? "010C1" : "010C")) << counted;
    }
}

TEST_F(SecondVisit, KeepsNothingOfAnAdapterThatNeverConnectedOrHasNoName)
{
    {
        ChannelRig rig(m_store, m_options);
        rig.bringUp();
    }
    EXPECT_EQ(m_store->protocol(m_adapter), 0);
    {
        ChannelRig rig(m_store, m_options);
        rig.ask("ATTP6");
        rig.channel.onConnected();
    }
    EXPECT_EQ(m_store->protocol("COM1 "), 0);
    {
        ChannelRig rig(m_store, m_options);
        rig.connect();
        EXPECT_EQ(m_store->protocol(m_adapter), 0);
        rig.ask("ATLP", 10);
        EXPECT_EQ(m_store->protocol(m_adapter), 6) << "with the farewell";
    }
    EXPECT_EQ(m_store->wait(m_adapter).steps, 0U) << "it waited for nothing";
}

TEST_F(SecondVisit, FallsBackWhereTheBusOfTheLastIsNotTheVehicles)
{
    for (char const* reply : {"CAN ERROR", "4100BE3EA813\rCAN ERROR", "hello"}) {
        m_store->setProtocol(m_adapter, 6);
        ChannelRig rig(m_store, m_options);
        rig.wire->on("0100", reply).on("0100", "SEARCHING...\r4100BE3EA813");
        rig.bringUp();
        EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATI", "ATE0", "ATL0", "ATS0", "ATST64", "ATTP6", "0100",
                                                          "ATTP0", "0100", "ATDPN", "ATH1"))
            << reply;
    }
    ChannelRig rig(m_store, m_options);
    rig.wire->on("ATI", "ELM327 v1.5");
    rig.ask("ATI");
    rig.ask("ATTP0");
    rig.ask("ATTP0");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATI", "ATTP6", "ATTP0")) << "it is tried once";
}

// What is behind the bus of the last visit begins as if that had never been tried.
TEST_F(SecondVisit, SearchesAsAFirstOneDoes)
{
    m_store->setProtocol(m_adapter, 6);
    ChannelRig silent(m_store, m_options);
    silent.wire->on("ATI", "ELM327 v1.5").on("0100", "CAN ERROR").on("0100", "NO DATA");
    for (char const* command : {"ATI", "ATTP0", "0100"}) {
        silent.ask(command);
    }
    EXPECT_THAT(silent.wire->takeCommands(), ElementsAre("ATI", "ATTP6", "0100", "ATTP0", "0100", "0100"))
        << "the vehicle may have to be woken";
    ChannelRig weak(m_store, m_options);
    weak.wire->on("ATI", "ELM327 v1.5").on("0100", "CAN ERROR").on("0100", "ERR94").on("0100", "4100BE3EA813");
    for (char const* command : {"ATI", "ATTP0", "ATDPN", "0100"}) {
        weak.ask(command, 5000);
    }
    EXPECT_THAT(weak.wire->takeCommands(),
                ElementsAre("ATI", "ATTP6", "ATDPN", "0100", "ATTP0", "0100", "ATFE", "ATTP0", "0100"));
}

// The adapter that does not let itself be told to search is asked no second time in vain.
TEST_F(SecondVisit, WithoutASearchTakesTheSilenceOfTheFirstBus)
{
    m_store->setProtocol(m_adapter, 6);
    ChannelRig rig(m_store, m_options);
    rig.wire->on("ATI", "ELM327 v1.5").on("0100", "NO DATA").on("ATTP0", "?");
    for (char const* command : {"ATI", "ATTP0", "0100"}) {
        rig.ask(command);
    }
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATI", "ATTP6", "0100", "ATTP0"));
}

// A wait that is recalled is cut once the vehicle has said something whole.
TEST_F(SecondVisit, CutsTheFirstWaitBehindAWholeLine)
{
    std::pair<support::ScriptedWire::Reply, bool> const rows[] = {
        {{{"4100BE3EA813\r", WireTime(20)}, {"\r>", WireTime(400)}}, true},
        {{{"SEARCHING...\r", WireTime(20)}, {"4100BE3EA813\r\r>", WireTime(400)}}, false},
        {{{"4100BE3EA813", WireTime(20)}, {"\r\r>", WireTime(400)}}, false},
        {{{"CAN ERROR\r", WireTime(20)}, {"\r>", WireTime(400)}}, false},
        {{{"4100BE3EA813\rCAN ERROR\r", WireTime(20)}, {"\r>", WireTime(400)}}, false},
    };
    for (auto const& [reply, isCut] : rows) {
        m_store->setProtocol(m_adapter, 6);
        m_store->setWait(m_adapter, {25, true});
        ChannelRig rig(m_store, m_options);
        rig.wire->on("ATI", "ELM327 v1.5").on("0100", reply);
        rig.wire->onInterrupt({{"STOPPED\r\r>", WireTime(4)}});
        for (char const* command : {"ATI", "ATE0", "ATST64", "ATTP0", "0100"}) {
            rig.ask(command, 2000);
        }
        EXPECT_EQ(rig.channel.statistics().waitsCut, isCut ? 1U : 0U) << reply.front().bytes;
    }
}

TEST_F(SecondVisit, RecallsAWaitOnCanWhereItIsShorter)
{
    struct Row
    {
        int protocol;
        unsigned int steps;
        bool shortWait;
        char const* sent;
    };
    for (auto const& [protocol, steps, shortWait, sent] :
         {Row{6, 30, true, "ATST1E"}, Row{9, 99, true, "ATST63"}, Row{6, 100, true, ""}, Row{6, 0, true, ""},
          Row{5, 30, true, ""}, Row{6, 30, false, ""}}) {
        m_store->setProtocol(m_adapter, protocol);
        m_store->setWait(m_adapter, {steps, false});
        ChannelRig rig(m_store, {.port = "COM1", .shortWait = shortWait});
        rig.wire->on("ATI", "ELM327 v1.5");
        for (char const* command : {"ATI", "ATST64", "ATTP0"}) {
            rig.ask(command);
        }
        auto const commands = rig.wire->takeCommands();
        EXPECT_EQ(commands.size(), *sent != 0 ? 4U : 3U) << protocol << " " << steps;
        EXPECT_EQ(commands[2], *sent != 0 ? sent : "ATTP" + std::to_string(protocol));
    }
}

TEST_F(SecondVisit, KnowsAVehicleByItsPlainNumberAlone)
{
    std::pair<std::string, bool> const rows[] = {{"0VELMRAS1MM00000Z", true},  {"9VELMRAS1MM00000A", true},
                                                 {"/VELMRAS1MM000001", false}, {":VELMRAS1MM000001", false},
                                                 {"@VELMRAS1MM000001", false}, {"[VELMRAS1MM000001", false},
                                                 {"VELMRAS1MM00000a1", false}};
    for (auto const& [vin, isOne] : rows) {
        std::vector<std::uint8_t> payload{0x49, 0x02, 0x01};
        payload.insert(payload.end(), vin.begin(), vin.end());
        std::string lines;
        for (std::string const& frame : plainFrames("7E8", payload)) {
            lines += (lines.empty() ? "" : "\r") + frame;
        }
        {
            ChannelRig rig(m_store, m_options);
            rig.connect();
            rig.wire->on("0902", lines);
            learnSpeed(rig);
            rig.ask("0902");
        }
        EXPECT_EQ(m_store->counts(vin).contains("010C"), isOne) << vin;
    }
}

} // namespace

} // namespace velmora
