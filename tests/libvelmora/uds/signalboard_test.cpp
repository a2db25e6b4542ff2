#include "libvelmora/uds/signalboard.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using testing::ElementsAre;
using BoardBytes = std::vector<unsigned char>;

char const* const boardSignals = R"toml(
[[signal]]
id = "A"
name = "First"
request = "2101"
formula = "A-1"
unit = "V"
precision = 1
values = { 5 = "five", 0 = "none" }

[[signal]]
id = "SLOW"
name = "Slow"
request = "2102"
formula = "A"
rate = 0.1

[[signal]]
id = "SUM"
name = "Sum"
formula = "value(\"A\")+value(\"SLOW\")"

[[signal]]
id = "MORE"
name = "More"
formula = "value(\"SUM\")*2"

[[signal]]
id = "LONG"
name = "Of four bytes"
request = "2103"
formula = "A"
length = 4

[[signal]]
id = "HALF"
name = "Half"
request = "2105"
formula = "A/2"
values = { 0 = "zero", 1 = "one" }

[[signal]]
id = "WORD"
name = "Word"
request = "2104"
text = { first = 1, count = 4 }
)toml";

class SignalBoardTest : public testing::Test
{
protected:
    SignalBoardTest()
    {
        std::ofstream(m_folder.file("s.toml")) << boardSignals;
        m_set = std::make_shared<SignalSet const>(std::vector<std::string>{m_folder.file("s.toml")},
                                                  m_folder.path() / "none", nullptr);
        m_board = std::make_unique<SignalBoard>(m_set);
    }

    ChosenSignal chosen(std::string const& id) const { return {m_set->find(id).front(), {}, {}, true}; }
    PollResult take(std::string const& id, BoardBytes const& data, std::chrono::milliseconds at = {})
    {
        BoardBytes payload{0x61, m_set->operator[](m_set->find(id).front()).signal.request[1]};
        payload.insert(payload.end(), data.begin(), data.end());
        return m_board->take(chosen(id), 0x7E8, 0x7E9, payload, SignalBoard::Time() + at);
    }
    std::string workedOut(std::string const& id, std::chrono::milliseconds at)
    {
        auto const result = m_board->workOut(chosen(id), SignalBoard::Time() + at);
        return result ? valueText(result->readings.at(0)) : "none";
    }
    static std::string texts(PollResult const& result)
    {
        obd::SensorValueDataModel const& value = *result.values.at(0);
        return value.value + " " + value.minimum + " " + value.maximum + " " + value.mean;
    }

    testsupport::TemporaryFolder m_folder;
    std::shared_ptr<SignalSet const> m_set;
    std::unique_ptr<SignalBoard> m_board;
};

TEST_F(SignalBoardTest, GivesAValueWithItsReadingAndStatistics)
{
    PollResult const first = take("A", {3});
    EXPECT_EQ(texts(first), "2.0 2.0 2.0 2.0");
    EXPECT_EQ(first.module, 0x7E8U);
    ASSERT_EQ(first.readings.size(), 1U);
    Reading const& reading = first.readings[0];
    EXPECT_EQ(reading.module, 0x7E9U) << "who spoke";
    EXPECT_EQ(reading.sensor, "A");
    EXPECT_EQ(reading.pid, "2101");
    EXPECT_EQ(reading.name, "First");
    EXPECT_EQ(reading.unit, "V");
    EXPECT_EQ(reading.precision, 1);
    EXPECT_EQ(reading.raw, (BoardBytes{0x61, 0x01, 3}));
    EXPECT_EQ(number(reading), 2.0);
    EXPECT_EQ(texts(take("A", {8})), "7.0 2.0 7.0 4.5");
    EXPECT_EQ(valueText(take("A", {1}).readings[0]), "none");
    PollResult const last = take("A", {3});
    EXPECT_EQ(last.values[0]->statistics->count, 3U);
    EXPECT_EQ(last.values[0]->number, 2.0);
    PollResult const word = take("A", {6});
    EXPECT_EQ(std::get<std::string>(word.readings[0].value), "five");
    EXPECT_EQ(word.values[0]->value, "five");
    EXPECT_EQ(valueText(take("HALF", {1}).readings[0]), "0.50") << "words are for whole numbers";
    EXPECT_EQ(valueText(take("HALF", {2}).readings[0]), "one");
    EXPECT_TRUE(m_board->troubles().empty());
}

TEST_F(SignalBoardTest, WorksOutValuesOfOthersWhileTheyAreFresh)
{
    using std::chrono::seconds;
    EXPECT_EQ(workedOut("SUM", seconds(0)), "none");
    take("A", {3}, seconds(0));
    take("SLOW", {10}, seconds(0));
    EXPECT_EQ(workedOut("SUM", seconds(10)), "12.00");
    EXPECT_EQ(workedOut("MORE", seconds(10)), "24.00");
    EXPECT_EQ(workedOut("SUM", std::chrono::milliseconds(10001)), "none") << "A is too old";
    take("A", {4}, seconds(30));
    EXPECT_EQ(workedOut("SUM", seconds(30)), "13.00") << "of one that is read each ten seconds three are waited for";
    take("A", {4}, std::chrono::milliseconds(30001));
    EXPECT_EQ(workedOut("SUM", std::chrono::milliseconds(30001)), "none");
    take("SLOW", {1}, seconds(31));
    EXPECT_EQ(workedOut("SUM", seconds(31)), "4.00");
    take("A", {}, seconds(31));
    EXPECT_EQ(workedOut("SUM", seconds(31)), "none") << "a reply without its value ends the last one";
    take("A", {4}, seconds(31));
    m_board->takeNothing(chosen("A"), 0x7E8);
    EXPECT_EQ(workedOut("SUM", seconds(31)), "none");
    std::vector<SignalTrouble> const troubles = m_board->troubles();
    ASSERT_EQ(troubles.size(), 1U);
    EXPECT_EQ(troubles[0].id, "A");
    EXPECT_EQ(troubles[0].withoutValue, 2U);
}

TEST_F(SignalBoardTest, TakesNoReplyOfAnotherLength)
{
    EXPECT_EQ(valueText(take("LONG", {1, 2, 3, 4}).readings[0]), "1.00");
    PollResult const shorter = take("LONG", {1, 2, 3});
    EXPECT_EQ(valueText(shorter.readings[0]), "-");
    EXPECT_TRUE(shorter.values.empty());
    EXPECT_EQ(valueText(take("LONG", {1, 2, 3, 4, 5}).readings[0]), "-");
    m_board->setReason({chosen("A"), chosen("LONG")}, "is refused");
    auto troubles = m_board->troubles();
    ASSERT_EQ(troubles.size(), 2U);
    EXPECT_EQ(troubles[0].reason, "is refused");
    EXPECT_EQ(troubles[1].withoutValue, 2U);
    m_board->setReason({chosen("A")}, "");
    EXPECT_EQ(m_board->troubles().size(), 1U);
}

TEST_F(SignalBoardTest, CutsTextsOutOfReplies)
{
    EXPECT_EQ(valueText(take("WORD", {'x', ' ', 'a', 'b', 0x7F, 'y'}).readings[0]), "ab");
    EXPECT_EQ(take("WORD", {'x', 'a', 'b', 'c', 'd'}).values.at(0)->value, "abcd");
    EXPECT_EQ(valueText(take("WORD", {'x', 'a', 'b', 'c'}).readings[0]), "-") << "one is missing";
    auto const cut = [](std::size_t first, std::size_t count, BoardBytes const& data) {
        return textOf({first, count}, data);
    };
    EXPECT_EQ(cut(0, 0, {'a', 'b'}), "ab");
    EXPECT_EQ(cut(1, 0, {'a', 'b'}), "b");
    EXPECT_EQ(cut(2, 0, {'a', 'b'}), std::nullopt);
    EXPECT_EQ(cut(3, 0, {'a', 'b'}), std::nullopt);
    EXPECT_EQ(cut(1, 1, {'a', '!', '~'}), "!");
    EXPECT_EQ(cut(2, 1, {'a', '!', '~'}), "~");
    EXPECT_EQ(cut(0, 3, {0, 0, 0}), "");
    EXPECT_EQ(cut(0, 3, {'a', 0, 'b'}), "a\xEF\xBF\xBD"
                                        "b");
}

} // namespace

} // namespace velmora
