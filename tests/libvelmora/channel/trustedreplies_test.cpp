// What of a reply is trusted, and which replies are remembered while a connection is brought up.

#include "libvelmora/channel/bringupmemory.h"
#include "libvelmora/channel/replyhealer.h"

#include <gtest/gtest.h>

namespace velmora {

namespace {

struct TrustedSent
{
    std::string request;
    BusKind bus = BusKind::Can11;
};

HealedReply healedAlone(std::string const& raw, TrustedSent const& sent)
{
    HabitCounts counts{};
    return ReplyHealer(counts).heal(raw, {ElmCommand(sent.request), sent.request, sent.bus, true});
}

TEST(TrustedReplies, OfWhichTheReplyBeforeOwesTwoFramesNeedBothOfThem)
{
    ReplyContext const context{ElmCommand("0904"), "0904", BusKind::Can11, true};
    HabitCounts counts{};
    ReplyHealer healer(counts);
    healer.heal("7E810140904014D4D4D\r", context);
    HealedReply const next = healer.heal("7E82133343536373839\r7E8100D490401303132\r7E82133343536373839\r", context);
    EXPECT_TRUE(next.doubtful);
    EXPECT_EQ(next.text(), "");
}

TEST(TrustedReplies, TrustLinesWithStraysByTheirLengthOrCheckByte)
{
    auto const kept = [](std::string const& raw, BusKind bus) { return healedAlone(raw, {"010C", bus}).text(); };
    std::string const stray = "\xFE";
    EXPECT_EQ(kept("18DAF110" + stray + "04410C1AF8000000\r", BusKind::Can29), "18DAF11004410C1AF8\r");
    EXPECT_EQ(kept("18DAF110" + stray + "04410C1AF800\r", BusKind::Can29), "");
    EXPECT_EQ(kept("486B10" + stray + "410C1AF822\r", BusKind::Iso9141), "486B10410C1AF822\r");
    EXPECT_EQ(kept("486B10" + stray + "410C1AF823\r", BusKind::Iso9141), "");
    EXPECT_EQ(kept("486B10410C1AF823\r", BusKind::Iso9141), "486B10410C1AF823\r") << "nothing tells that it is wrong";
}

TEST(TrustedReplies, KnowThatAnAdapterShowsCheckBytesBehindThreeInARow)
{
    ReplyContext const context{ElmCommand("010C"), "010C", BusKind::Iso9141, true};
    std::string const right = "486B10410C1AF822\r";
    std::string const wrong = "486B10410C1AF823\r";
    HabitCounts counts{};
    ReplyHealer healer(counts);
    for (std::string const& line : {right, right, wrong, right, right, wrong, right, right, right}) {
        EXPECT_EQ(healer.heal(line, context).text(), line);
    }
    EXPECT_EQ(healer.heal(wrong, context).text(), "");
    EXPECT_EQ(healer.heal(right, context).text(), right);
    EXPECT_EQ(healer.heal(wrong, context).text(), "") << "from then on";
}

TEST(TrustedReplies, OfThreeDigitsALineAreLeftToTheReader)
{
    EXPECT_EQ(healedAlone("014\r", {"010C"}).text(), "014\r");
    EXPECT_EQ(healedAlone("0141\r", {"010C"}).text(), "");
}

TEST(BringUpMemory, KeepsMasksInWhichAllHaveSpoken)
{
    BringUpMemory memory;
    EXPECT_FALSE(memory.isOn());
    memory.start();
    EXPECT_TRUE(memory.isOn());
    auto const remember = [&memory](char const* request, char const* raw) {
        memory.remember(ElmCommand(request), healedAlone(raw, {request}));
        return memory.recall(ElmCommand(request)).has_value();
    };
    EXPECT_FALSE(remember("0101", "7EA06410100000000\r")) << "no mask";
    EXPECT_FALSE(remember("0100", "NO DATA\r"));
    EXPECT_TRUE(remember("0100", "7E8064100BE3EA813\r7E906410080000001\r"));
    EXPECT_EQ(memory.modules(), (std::set<unsigned int>{0x7E8, 0x7E9})) << "those of the first mask";
    EXPECT_FALSE(remember("0120", "7E8064120A007F011\r"));
    EXPECT_FALSE(remember("0140", "7E8064140A007F011\r7E906414080000001\rCAN ERROR\r"));
    EXPECT_TRUE(remember("0900", "7E806490014400000\r7E906490014400000\r"));
    memory.start();
    EXPECT_TRUE(memory.modules().empty());
    EXPECT_FALSE(remember("0100", "7E8064100BE3EA813\r7E9064100\r")) << "a line was lost";
    EXPECT_FALSE(memory.isOn()) << "who spoke nobody knows";
    memory.start();
    EXPECT_TRUE(remember("0100", "7E8064100BE3EA813\r"));
    memory.stop();
    EXPECT_FALSE(memory.isOn());
    EXPECT_EQ(memory.recall(ElmCommand("0100")), std::nullopt);
}

} // namespace

} // namespace velmora
