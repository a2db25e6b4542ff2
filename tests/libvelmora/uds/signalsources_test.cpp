// How signals are divided into groups, and what a group asks in one turn.
#include "libvelmora/poll/pollwire.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/signalsources.h"
#include "tests/support/modulebench.h"
#include "tests/support/temporaryfolder.h"

#include <fmt/format.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using testing::ElementsAre;

// S0 to S9 of one byte each by the identifiers 0100 on, TEN by 0100 too, LONGER by 0101 of another length, SUM.
std::string sourceSignals()
{
    std::string text;
    for (int i = 0; i < 10; ++i) {
        text += fmt::format("[[signal]]\nid = \"S{0}\"\nname = \"S{0}\"\nheader = \"7E4\"\nrequest = \"22010{0}\"\n"
                            "formula = \"A\"\nlength = 1\n",
                            i);
    }
    return text + "[[signal]]\nid = \"TEN\"\nname = \"Ten\"\nheader = \"7E4\"\nrequest = \"220100\"\n"
                  "formula = \"A*10\"\nlength = 1\n"
                  "[[signal]]\nid = \"LONGER\"\nname = \"Longer\"\nheader = \"7E4\"\nrequest = \"220101\"\n"
                  "formula = \"A\"\nlength = 2\n"
                  "[[signal]]\nid = \"SUM\"\nname = \"Sum\"\nformula = \"value(\\\"S0\\\")+value(\\\"S1\\\")\"\n";
}

class SignalSourcesTest : public testing::Test
{
protected:
    SignalSourcesTest()
    {
        std::string const file = m_folder.file("mine.toml");
        std::ofstream(file) << sourceSignals();
        m_set = std::make_shared<SignalSet const>(std::vector<std::string>{file}, m_folder.path() / "none", nullptr);
        m_board = std::make_shared<SignalBoard>(m_set);
        m_asker = std::make_shared<ModuleAsker>(*m_bench, *m_bench);
        m_wire = std::make_unique<PollWire>(m_bench, std::chrono::milliseconds(0));
        for (int i = 0; i < 10; ++i) {
            m_bench->module("7E4", fmt::format("22010{}", i), {fmt::format("7EC04620{}0{}0{}", 1, i, i)});
        }
    }

    ChosenSignal chosen(std::string const& id, bool told = true) const
    {
        return {m_set->find(id).front(), {}, {}, told};
    }
    static RequestAddress at(std::string const& header, std::optional<unsigned char> ext = {})
    {
        return addressOf(header, ext ? "607" : "", ext, obd::ObdProtocolCan11).address.value();
    }
    static std::string wishes(PollSource const& source)
    {
        std::string text = fmt::format("{}:", source.hertz.value_or(-1));
        for (PollGuestWish const& wish : source.guest->wishes()) {
            text += fmt::format(" {:X}/{}", wish.module, wish.sensor);
        }
        return text;
    }
    std::string turn(IPollGuest& group)
    {
        std::string text;
        for (PollResult const& result : group.turn(*m_wire)) {
            text +=
                (text.empty() ? "" : " ") + result.readings.front().sensor + "=" + valueText(result.readings.front());
        }
        return text;
    }
    std::string asked()
    {
        std::string text;
        for (std::string const& each : m_bench->takeAsked()) {
            text += (text.empty() ? "" : " ") + each.substr(each.find(' ') + 1);
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

TEST_F(SignalSourcesTest, AreAGroupForEachModuleRateAndEightRequests)
{
    SignalSources sources(m_board, m_asker);
    EXPECT_TRUE(sources.take().empty());
    for (int i = 0; i < 9; ++i) {
        sources.add(chosen(fmt::format("S{}", i)), 0x7EC, at("7E4"), 2.0);
    }
    sources.add(chosen("TEN"), 0x7EC, at("7E4"), 2.0);
    sources.add(chosen("S0"), 0x7EC, at("7E4"), 3.0);
    sources.add(chosen("S0"), 0x7ED, at("7E5"), 2.0);
    sources.add(chosen("S0"), 0, std::nullopt, std::nullopt);
    sources.addWorkedOut(chosen("SUM"));
    std::vector<PollSource> const taken = sources.take();
    std::vector<std::string> texts;
    for (PollSource const& each : taken) {
        texts.push_back(wishes(each));
    }
    EXPECT_THAT(texts, ElementsAre("2: 7EC/S0 7EC/S1 7EC/S2 7EC/S3 7EC/S4 7EC/S5 7EC/S6 7EC/S7", "2: 7EC/S8 7EC/TEN",
                                   "3: 7EC/S0", "2: 7ED/S0", "-1: 0/S0 0/SUM"));
    EXPECT_TRUE(sources.take().empty()) << "they were taken";
    sources.addWorkedOut(chosen("SUM"));
    std::vector<PollSource> const alone = sources.take();
    ASSERT_EQ(alone.size(), 1U);
    EXPECT_EQ(wishes(alone.front()), "1: 0/SUM");
    sources.add(chosen("S3"), 0x7EC, at("7E4"), 2.0);
    EXPECT_EQ(wishes(sources.take().front()), "2: 7EC/S3") << "a group of its own anew";
}

TEST_F(SignalSourcesTest, FillAGroupWithEightRequestsOfWhichOneMayBeSharedByMore)
{
    SignalSources sources(m_board, m_asker);
    for (int i = 0; i < 8; ++i) {
        sources.add(chosen(fmt::format("S{}", i)), 0x7EC, at("7E4"), {});
    }
    sources.add(chosen("TEN"), 0x7EC, at("7E4"), {});
    ASSERT_EQ(sources.take().size(), 1U) << "the ninth signal is in a reply that comes anyway";
}

TEST_F(SignalSourcesTest, AskForThreeIdentifiersAtOnceOfAModuleWithoutAddressByte)
{
    SignalGroup group(m_board, m_asker, at("7E4"));
    for (char const* const id : {"S0", "S1", "S2", "S3"}) {
        group.add(chosen(id), 0x7EC);
    }
    EXPECT_EQ(turn(group), "S0=0.00 S1=1.00 S2=2.00 S3=3.00");
    EXPECT_EQ(asked(), "220100 220101 220102 220103") << "singly, until each has shown its length";
    m_bench->module("7E4", "22010001010102", {"7EC100A620100080101", "7EC2109010207000000"});
    EXPECT_EQ(turn(group), "S0=8.00 S1=9.00 S2=7.00 S3=3.00");
    EXPECT_EQ(asked(), "22010001010102 220103");

    SignalGroup extended(m_board, m_asker, at("6F1", 0x07));
    for (char const* const id : {"S0", "S1", "S2"}) {
        extended.add(chosen(id), 0x607);
        std::string const number = m_set->operator[](m_set->find(id).front()).signal.id.substr(1);
        m_bench->module("6F1", "22010" + number, {"6070462010" + number + "0" + number});
    }
    turn(extended);
    asked();
    turn(extended);
    EXPECT_EQ(asked().substr(0, 11), "2201000101 ") << "two fit behind an address byte";
}

TEST_F(SignalSourcesTest, AskAloneWhatIsAloneOrOfNoSureLength)
{
    SignalGroup one(m_board, m_asker, at("7E4"));
    one.add(chosen("S0"), 0x7EC);
    turn(one);
    m_bench->module("7E4", "220100", {"7EC037F2222"});
    asked();
    turn(one);
    turn(one);
    EXPECT_EQ(asked(), "220100 220100") << "once a turn, and no more after the refusal";
    turn(one);
    EXPECT_EQ(asked(), "");

    SignalGroup two(m_board, m_asker, at("7E4"));
    for (char const* const id : {"S1", "LONGER", "S2", "S3"}) {
        two.add(chosen(id), 0x7EC);
    }
    EXPECT_EQ(turn(two), "S1=1.00 LONGER=- S2=2.00 S3=3.00") << "a reply of one byte is none of two";
    asked();
    turn(two);
    EXPECT_EQ(asked(), "2201020103 220101 220102 220103") << "of what differs in its length nobody knows where it ends";

    SignalGroup wrong(m_board, m_asker, at("7E5"));
    wrong.add(chosen("S4"), 0x7ED);
    wrong.add(chosen("S5"), 0x7ED);
    m_bench->module("7E5", "220104", {"7ED056201040404"}).module("7E5", "220105", {"7ED0462010505"});
    turn(wrong);
    asked();
    turn(wrong);
    EXPECT_EQ(asked(), "220104 220105") << "the reply was longer than the file says";
}

TEST_F(SignalSourcesTest, GoOnTogetherAfterTroubleOnTheBusButNotAfterARefusal)
{
    for (auto const& [header, trouble, later] : {std::tuple("7E5", "CAN ERROR", "2201000101 220100 220101"),
                                                 std::tuple("7E6", "7EE037F2213", "220100 220101")}) {
        SignalGroup group(m_board, m_asker, at(header));
        group.add(chosen("S0"), 0);
        group.add(chosen("S1"), 0);
        std::string const reply = fmt::format("{:X}", std::stoi(header, nullptr, 16) + 8);
        m_bench->module(header, "220100", {reply + "0462010000"}).module(header, "220101", {reply + "0462010101"});
        m_bench->module(header, "2201000101", {trouble});
        turn(group);
        turn(group);
        asked();
        EXPECT_EQ(turn(group), "S0=0.00 S1=1.00");
        EXPECT_EQ(asked(), later) << trouble;
    }
}

TEST_F(SignalSourcesTest, AskSinglyAModuleThatWantsLessAtOnce)
{
    SignalGroup group(m_board, m_asker, at("7E4"));
    group.add(chosen("S0"), 0x7EC);
    group.add(chosen("S1"), 0x7EC);
    turn(group);
    m_bench->module("7E4", "220100", {"7EC037F2214"}); // response too long
    turn(group);
    turn(group);
    asked();
    turn(group);
    EXPECT_EQ(asked(), "220100 220101");
}

TEST_F(SignalSourcesTest, TellOnlyWhatIsWantedAndNothingUnreadable)
{
    SignalGroup group(m_board, m_asker, at("7E4"));
    group.add(chosen("S0", false), 0x7EC);
    group.add(chosen("S1"), 0x7EC);
    group.addWorkedOut(chosen("SUM"));
    EXPECT_EQ(turn(group), "S1=1.00 SUM=1.00") << "S0 is read for the sum alone";
    std::vector<PollGuestWish> const wished = group.wishes();
    ASSERT_EQ(wished.size(), 2U);
    EXPECT_EQ(wished[0].module, 0x7ECU);
    EXPECT_EQ(wished[0].id, signalId(chosen("S1").index));
    EXPECT_EQ(wished[1].module, 0U);
    SignalGroup broken(m_board, m_asker, at("7E5"));
    broken.add(chosen("S0", false), 0x7ED);
    broken.add(chosen("S2"), 0x7ED);
    m_bench->module("7E5", "220100", {"7ED100A620100"}).module("7E5", "220102", {"7ED100A620102"});
    EXPECT_EQ(turn(broken), "S2=-") << "a message without its end tells nothing";
    EXPECT_EQ(m_board->troubles().at(1).reason, "is answered unreadably");
}

TEST_F(SignalSourcesTest, TakeOfABroadcastTheFirstGoodAnswer)
{
    SignalGroup group(m_board, m_asker, std::nullopt);
    group.add(chosen("S0"), 0);
    group.add(chosen("TEN", false), 0);
    m_bench->answer("22 01 00", {{0x7E8, "62 01 00 05"}, {0x7E9, "62 01 00 06"}});
    EXPECT_EQ(turn(group), "S0=5.00");
    EXPECT_TRUE(m_board->troubles().empty());
    SignalGroup second(m_board, m_asker, std::nullopt);
    second.add(chosen("S0"), 0x7E9);
    EXPECT_EQ(turn(second), "S0=6.00");
    m_bench->answer("22 01 00", {{0x7E8, "7F 22 31"}, {0x7E9, "62 01 00 06"}});
    turn(second);
    EXPECT_TRUE(m_board->troubles().empty()) << "one of them told it";
    m_bench->answer("22 01 00", {{0x7E8, "7F 22 22"}});
    EXPECT_EQ(turn(group), "");
    EXPECT_EQ(m_board->troubles().at(0).reason, "is refused: Conditions Not Correct");
    SignalGroup third(m_board, m_asker, std::nullopt);
    third.add(chosen("S3"), 0);
    EXPECT_EQ(turn(third), "");
    EXPECT_EQ(m_board->troubles().at(1).id, "S3");
    EXPECT_EQ(m_board->troubles().at(1).reason, "is not answered");
}

} // namespace

} // namespace velmora
