#include "libvelmora/poll/pollwire.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/signalgroup.h"
#include "tests/support/modulebench.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

char const* const groupSignals = R"toml(
[[signal]]
id = "ONE"
name = "One"
header = "7E4"
request = "220101"
formula = "A"
length = 1

[[signal]]
id = "TWO"
name = "Two"
header = "7E4"
request = "220102"
formula = "A+value(\"ONE\")"
length = 2

[[signal]]
id = "SUM"
name = "Sum"
formula = "value(\"ONE\")+value(\"TWO\")"

[[signal]]
id = "ANYBODY"
name = "Anybody"
request = "22F40C"
formula = "int16(A, B)/4"
)toml";

// A group on modules that a test makes up, at a time of its own.
class SignalGroupTest : public testing::Test
{
protected:
    SignalGroupTest()
    {
        std::string const file = m_folder.file("mine.toml");
        std::ofstream(file) << groupSignals;
        m_set = std::make_shared<SignalSet const>(std::vector<std::string>{file}, m_folder.path() / "none", nullptr);
        m_board = std::make_shared<SignalBoard>(m_set);
        m_asker = std::make_shared<ModuleAsker>(*m_bench, *m_bench);
        m_wire = std::make_unique<PollWire>(m_bench, std::chrono::milliseconds(0));
    }

    ChosenSignal chosen(std::string const& id) const { return {m_set->find(id).front(), {}, {}, true}; }

    std::string turn(SignalGroup& group)
    {
        std::string text;
        for (PollResult const& result : group.turn(*m_wire)) {
            Reading const& reading = result.readings.front();
            text += (text.empty() ? "" : " ") + reading.sensor + "=" + valueText(reading);
        }
        return text;
    }

    support::FakeClock m_clock;
    testsupport::TemporaryFolder m_folder;
    std::shared_ptr<support::ModuleBench> m_bench = std::make_shared<support::ModuleBench>(&m_clock);
    std::shared_ptr<SignalSet const> m_set;
    std::shared_ptr<SignalBoard> m_board;
    std::shared_ptr<ModuleAsker> m_asker;
    std::unique_ptr<PollWire> m_wire;
};

TEST_F(SignalGroupTest, AsksTogetherWhatHasProvedItsLength)
{
    SignalGroup group(m_board, m_asker, addressOf("7E4", {}, {}, obd::ObdProtocolCan11).address);
    group.add(chosen("ONE"), 0x7EC);
    group.add(chosen("TWO"), 0x7EC);
    group.addWorkedOut(chosen("SUM"));
    m_bench->module("7E4", "220101", {"7EC0462010105"}).module("7E4", "220102", {"7EC056201020700"});
    m_bench
        ->module("7E4", "2201010102", {"7EC07620102080001010"}) // cut
        .module("7E4", "2201010102", {"7EC1008620102080001", "7EC21010600000000"});
    EXPECT_EQ(group.wishes().size(), 3U);
    EXPECT_EQ(turn(group), "ONE=5.00 TWO=12.00 SUM=17.00");
    EXPECT_THAT(m_bench->takeAsked(), ElementsAre("7E4 220101", "7E4 220102"));
    EXPECT_EQ(turn(group), "ONE=5.00 TWO=12.00 SUM=17.00") << "what does not divide is asked for singly";
    EXPECT_THAT(m_bench->takeAsked(), ElementsAre("7E4 2201010102", "7E4 220101", "7E4 220102"));
    turn(group);
    EXPECT_THAT(m_bench->takeAsked(), ElementsAre("7E4 220101", "7E4 220102")) << "from then on";

    SignalGroup other(m_board, m_asker, addressOf("7E4", {}, {}, obd::ObdProtocolCan11).address);
    other.add(chosen("ONE"), 0x7EC);
    other.add(chosen("TWO"), 0x7EC);
    turn(other);
    m_bench->takeAsked();
    EXPECT_EQ(turn(other), "ONE=6.00 TWO=14.00");
    EXPECT_THAT(m_bench->takeAsked(), ElementsAre("7E4 2201010102"));
}

TEST_F(SignalGroupTest, AsksSinglyWhereAModuleLeavesIdentifiersOut)
{
    SignalGroup group(m_board, m_asker, addressOf("7E4", {}, {}, obd::ObdProtocolCan11).address);
    group.add(chosen("ONE"), 0x7EC);
    group.add(chosen("TWO"), 0x7EC);
    m_bench->module("7E4", "220101", {"7EC0462010105"}).module("7E4", "220102", {"7EC056201020700"});
    m_bench->module("7E4", "2201010102", {"7EC0462010108"}); // of two only one
    turn(group);
    m_bench->takeAsked();
    EXPECT_EQ(turn(group), "ONE=5.00 TWO=12.00");
    EXPECT_THAT(m_bench->takeAsked(), ElementsAre("7E4 2201010102", "7E4 220101", "7E4 220102"));
    turn(group);
    EXPECT_THAT(m_bench->takeAsked(), ElementsAre("7E4 220101", "7E4 220102"));

    SignalGroup silent(m_board, m_asker, addressOf("7E5", {}, {}, obd::ObdProtocolCan11).address);
    silent.add(chosen("ONE"), 0x7ED);
    silent.add(chosen("TWO"), 0x7ED);
    m_bench->module("7E5", "220101", {"7ED0462010105"}).module("7E5", "220102", {"7ED056201020700"});
    turn(silent);
    turn(silent);
    m_bench->takeAsked();
    turn(silent);
    EXPECT_THAT(m_bench->takeAsked(), ElementsAre("7E5 2201010102", "7E5 220101", "7E5 220102"))
        << "silence tells nothing of what the module can";
}

TEST_F(SignalGroupTest, LeavesAloneWhatWasRefused)
{
    SignalGroup group(m_board, m_asker, addressOf("7E4", {}, {}, obd::ObdProtocolCan11).address);
    group.add(chosen("ONE"), 0x7EC);
    group.add(chosen("TWO"), 0x7EC);
    m_bench->module("7E4", "220101", {"7EC037F2231"}).module("7E4", "220102", {"7EC037F2222"});
    EXPECT_EQ(turn(group), "");
    m_bench->takeAsked();
    m_clock.advance(29000);
    EXPECT_EQ(turn(group), "");
    EXPECT_THAT(m_bench->takeAsked(), IsEmpty());
    m_clock.advance(1500);
    m_bench->module("7E4", "220102", {"7EC056201020700"});
    turn(group);
    EXPECT_THAT(m_bench->takeAsked(), ElementsAre("7E4 220102"));
    auto const troubles = m_board->troubles();
    ASSERT_FALSE(troubles.empty());
    EXPECT_EQ(troubles.front().id, "ONE");
    EXPECT_EQ(troubles.front().reason, "is refused: Request Out of Range");
    group.stop();
    m_clock.advance(60000);
    turn(group);
    EXPECT_THAT(m_bench->takeAsked(), IsEmpty()) << "who stops does not wait for requests";
}

TEST_F(SignalGroupTest, CountsAWrongEchoAndShowsNoValue)
{
    SignalGroup group(m_board, m_asker, addressOf("7E4", {}, {}, obd::ObdProtocolCan11).address);
    group.add(chosen("ONE"), 0x7EC);
    group.addWorkedOut(chosen("SUM"));
    m_bench->module("7E4", "220101", {"7EC0462010105"}).module("7E4", "220101", {"7EC0462010205"});
    EXPECT_EQ(turn(group), "ONE=5.00");
    EXPECT_EQ(turn(group), "ONE=-") << "the value of before is not shown on";
    auto const troubles = m_board->troubles();
    ASSERT_EQ(troubles.size(), 1U);
    EXPECT_EQ(troubles.front().withoutValue, 1U);
    EXPECT_EQ(troubles.front().reason, "is answered by something else");
}

TEST_F(SignalGroupTest, TakesABroadcastFromWhoeverAnswersItRightly)
{
    SignalGroup group(m_board, m_asker, std::nullopt);
    group.add(chosen("ANYBODY"), 0);
    m_bench->answer("22 F4 0C", {{0x7E8, "7F 22 11"}, {0x7E9, "62 F4 0D 50"}, {0x7EA, "62 F4 0C 0B B8"}});
    EXPECT_EQ(turn(group), "ANYBODY=750.00");
    SignalGroup one(m_board, m_asker, std::nullopt);
    one.add(chosen("ANYBODY"), 0x7E8);
    EXPECT_EQ(turn(one), "") << "another module was meant";
}

} // namespace

} // namespace velmora
