// Values of signals at the limits of what a board keeps and works out.
#include "libvelmora/uds/signalboard.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

namespace velmora {

namespace {

char const* const oddSignals = R"toml(
[[signal]]
id = "SIGNED"
name = "Signed"
request = "2101"
formula = "signed8(A)/100"
precision = 1

[[signal]]
id = "WHOLE"
name = "Whole"
request = "2102"
formula = "signed8(A)/10"
precision = 0

[[signal]]
id = "NAME"
name = "A text of three bytes"
request = "2103"
text = { first = 0, count = 2 }
length = 3

[[signal]]
id = "BIG"
name = "Big"
request = "2104"
formula = "int32(A, B, C, D)"
values = { 999999999 = "most", 1000000000 = "too much" }

[[signal]]
id = "L0"
name = "The first of a chain"
request = "2105"
formula = "A"
)toml";

// L1 is four times L0 in four terms, and so on up to L18.
std::string chainOfSignals()
{
    std::string text = oddSignals;
    for (int i = 1; i <= 18; ++i) {
        std::string const before = "value(\\\"L" + std::to_string(i - 1) + "\\\")";
        text += "\n[[signal]]\nid = \"L" + std::to_string(i) + "\"\nname = \"Link\"\nformula = \"(" + before + "+" +
                before + "+" + before + "+" + before + ")/4\"\n";
    }
    return text;
}

class OddSignalTest : public testing::Test
{
protected:
    OddSignalTest()
    {
        std::ofstream(m_folder.file("s.toml")) << chainOfSignals();
        m_set = std::make_shared<SignalSet const>(std::vector<std::string>{m_folder.file("s.toml")},
                                                  m_folder.path() / "none", nullptr);
        m_board = std::make_unique<SignalBoard>(m_set);
    }

    ChosenSignal chosen(std::string const& id) const { return {m_set->find(id).front(), {}, {}, true}; }
    // As it is shown; "-" for none.
    std::string take(std::string const& id, std::vector<unsigned char> const& payload)
    {
        PollResult const result = m_board->take(chosen(id), 0x7E8, 0x7E8, payload, SignalBoard::Time());
        return result.values.empty() ? "-" : result.values[0]->value;
    }

    testsupport::TemporaryFolder m_folder;
    std::shared_ptr<SignalSet const> m_set;
    std::unique_ptr<SignalBoard> m_board;
};

TEST_F(OddSignalTest, AreShownWithoutANegativeZero)
{
    EXPECT_EQ(take("SIGNED", {0x61, 1, 0}), "0.0");
    EXPECT_EQ(take("SIGNED", {0x61, 1, 0xFE}), "0.0") << "-0.02";
    EXPECT_EQ(take("SIGNED", {0x61, 1, 0xF6}), "-0.1");
    EXPECT_EQ(take("SIGNED", {0x61, 1, 0x9C}), "-1.0");
    EXPECT_EQ(take("WHOLE", {0x61, 2, 0xFD}), "0");
    EXPECT_EQ(take("WHOLE", {0x61, 2, 0xF6}), "-1");
    EXPECT_EQ(take("WHOLE", {0x61, 2, 0x64}), "10");
}

TEST_F(OddSignalTest, HaveNoValueInARepliesOfAnotherShape)
{
    EXPECT_EQ(take("NAME", {0x61, 3, 'a', 'b', 'c'}), "ab");
    EXPECT_EQ(take("NAME", {0x61, 3, 'a', 'b'}), "-");
    EXPECT_EQ(take("WHOLE", {0x61}), "-") << "not even the echo is whole";
    EXPECT_EQ(take("BIG", {0x61, 4, 0x3B, 0x9A, 0xC9, 0xFF}), "most");
    EXPECT_EQ(take("BIG", {0x61, 4, 0x3B, 0x9A, 0xCA, 0x00}), "1000000000.00") << "words are for up to nine digits";
    EXPECT_EQ(m_board->troubles().size(), 2U);
    EXPECT_EQ(SignalTrouble().withoutValue, 0U);
    EXPECT_EQ(ChosenSignal().index, 0U);
    EXPECT_TRUE(ChosenSignal().told);
}

TEST_F(OddSignalTest, AreWorkedOutOfEachOtherToADepthOfSeventeen)
{
    take("L0", {0x61, 5, 8});
    auto const deep = m_board->workOut(chosen("L17"), SignalBoard::Time());
    ASSERT_TRUE(deep) << "and each only once, or it would take hours";
    EXPECT_EQ(number(deep->readings[0]), 8.0);
    EXPECT_FALSE(m_board->workOut(chosen("L18"), SignalBoard::Time()));
    EXPECT_EQ(deep->module, 0U);
    EXPECT_EQ(deep->readings[0].module, 0U);
    ChosenSignal ofModule = chosen("L1");
    ofModule.module = 0x7E9;
    PollResult const told = m_board->workOut(ofModule, SignalBoard::Time()).value();
    EXPECT_EQ(told.module, 0x7E9U);
    EXPECT_EQ(told.readings[0].module, 0x7E9U);
    auto const age = std::chrono::system_clock::now() - told.readings[0].time;
    EXPECT_LT(age, std::chrono::minutes(1));
}

} // namespace

} // namespace velmora
