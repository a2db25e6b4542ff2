// What is known of a reply beside its lines, by which the channel decides what to do about it.

#include "libvelmora/channel/replyhealer.h"

#include <gtest/gtest.h>

namespace velmora {

namespace {

struct Sent
{
    std::string request;
    BusKind bus = BusKind::Can11;
    bool extended = false;
};

HealedReply healedOnce(std::string const& raw, Sent const& sent)
{
    HabitCounts counts{};
    return ReplyHealer(counts).heal(raw, {ElmCommand(sent.request), sent.request, sent.bus, true, sent.extended});
}

// The words for all that is noticed of a reply.
std::string factsOf(HealedReply const& reply)
{
    std::pair<bool, char const*> const facts[] = {
        {reply.silent, "silent"},     {reply.echoed, "echoed"},       {reply.refused, "refused"},
        {reply.reset, "reset"},       {reply.notices, "notices"},     {reply.data, "data"},
        {reply.pending, "pending"},   {reply.answered, "answered"},   {reply.dropped, "dropped"},
        {reply.doubtful, "doubtful"}, {reply.irregular, "irregular"},
    };
    std::string text = reply.error;
    for (auto const& [is, word] : facts) {
        text += is ? (text.empty() ? "" : " ") + std::string(word) : "";
    }
    return text;
}

std::string factsOf(std::string const& raw, Sent const& sent = {"010C"})
{
    return factsOf(healedOnce(raw, sent));
}

TEST(HealedReplies, AreToldByWhatStandsInThem)
{
    EXPECT_EQ(factsOf("7E804410C1AF8\r"), "data answered");
    EXPECT_EQ(factsOf("010C\r7E804410C1AF8\r"), "echoed data answered");
    EXPECT_EQ(factsOf("010C\r"), "echoed irregular") << "an echo alone is not silence";
    EXPECT_EQ(factsOf("\r\r"), "silent irregular");
    EXPECT_EQ(factsOf("SEARCHING...\r7E804410C1AF8\r"), "notices data answered");
    EXPECT_EQ(factsOf("SEARCHING...\r"), "notices irregular");
    EXPECT_EQ(factsOf("?\r"), "refused irregular");
    EXPECT_EQ(factsOf("CAN ERROR\rNO DATA\r"), "CANERROR irregular") << "the first word";
    EXPECT_EQ(factsOf("7E804410C1AF8\rCAN ERROR\r"), "CANERROR data answered");
    EXPECT_EQ(factsOf("7E8037F0112\r"), "data irregular");
    EXPECT_EQ(factsOf("7E8037F0178\r"), "data pending");
    EXPECT_EQ(factsOf("7E8037F0178\r7E804410C1AF8\r"), "data answered irregular");
    EXPECT_EQ(factsOf("7E803410D20\r"), "data irregular") << "somebody else's answer";
    EXPECT_EQ(factsOf("7E803410D20\r7E904410C1AF8\r"), "data answered irregular");
    EXPECT_EQ(factsOf("7E804410C1A\r"), "dropped");
    EXPECT_EQ(factsOf("7E804410C1AF8\r7E904410C1A\r"), "data answered dropped");
    EXPECT_EQ(factsOf("7E804410C1AF8\r7E904410C1AF8 <RX ERROR\r"), "data answered dropped");
    EXPECT_EQ(factsOf("ELM327 v1.5\r"), "reset irregular");
    EXPECT_EQ(factsOf("LV RESET\r"), "LVRESET reset irregular");
    EXPECT_EQ(factsOf("hello\r"), "irregular");
    EXPECT_EQ(factsOf("7E8101449020156454C\r", {"0902"}), "data irregular") << "half a message";
    EXPECT_EQ(factsOf("7E8100E490A01454341\r7E82265AAAAAAAAAAAA\r7E8212D00456E67696E\r", {"090A"}),
              "data answered irregular")
        << "its frames came out of order";
    EXPECT_EQ(factsOf("41 0C 1A F8\r", {"010C", BusKind::Unknown}), "data") << "no frames are shown";
    EXPECT_EQ(factsOf("48\r6B\r10\r41\r", {"010C", BusKind::Iso9141}), "data irregular");
}

TEST(HealedReplies, ToCommandsAreTextsWithTheirTrouble)
{
    EXPECT_EQ(factsOf("OK\r", {"ATE0"}), "");
    EXPECT_EQ(factsOf("ATE0\rOK\r", {"ATE0"}), "echoed");
    EXPECT_EQ(factsOf("?\r", {"ATE0"}), "refused");
    EXPECT_EQ(factsOf("41\r?\rOK", {"ATE0"}), "refused");
    EXPECT_EQ(factsOf("STOPPED\rNO DATA\r", {"ATRV"}), "STOPPED");
    EXPECT_EQ(factsOf("ELM327 v1.5\r", {"ATRV"}), "reset");
    EXPECT_EQ(factsOf("", {"ATRV"}), "silent");
    EXPECT_EQ(healedOnce("ELM327 v1.5\r\r", {"ATI"}).text(), "ELM327 v1.5\r");
    HabitCounts counts{};
    HealedReply const plain = ReplyHealer(counts).heal("ATE0\rOK\r", {ElmCommand("ATE0"), "ATE0"});
    EXPECT_FALSE(plain.echoed) << "nobody had told it to leave that away";
    EXPECT_EQ(plain.text(), "ATE0\rOK\r");
}

TEST(HealedReplies, AreWholeIfNothingElseStandsInThem)
{
    HealedReply reply;
    EXPECT_FALSE(reply.whole());
    reply.answered = true;
    EXPECT_TRUE(reply.whole());
    for (bool HealedReply::*const flaw : {&HealedReply::dropped, &HealedReply::irregular, &HealedReply::pending,
                                          &HealedReply::refused, &HealedReply::notices}) {
        HealedReply flawed = reply;
        flawed.*flaw = true;
        EXPECT_FALSE(flawed.whole());
    }
    reply.error = "NODATA";
    EXPECT_FALSE(reply.whole());
}

TEST(HealedReplies, TellWhoSpokeAndWhoAnswered)
{
    HealedReply const reply = healedOnce("7E8037F0112\r7E904410C1AF8\r7E904410C1AF9\r7EA0541\r", {"010C"});
    EXPECT_EQ(reply.spoke, (std::set<unsigned int>{0x7E8, 0x7E9}));
    EXPECT_EQ(reply.frames, (std::map<unsigned int, unsigned int>{{0x7E9, 2}}));
    EXPECT_EQ(reply.frameCount(), 2U);
    EXPECT_EQ(reply.messages.at(0x7E9), (std::vector<std::uint8_t>{0x41, 0x0C, 0x1A, 0xF9})) << "the last one";
}

// What is behind the service of a reply, for the services whose requests tell an item.
TEST(HealedReplies, AnswerTheirRequestByServiceAndItem)
{
    struct Row
    {
        char const* request;
        char const* reply;
        bool answers;
    };
    Row const rows[] = {
        {"010C", "7E804410C1AF8", true},   {"010C0D", "7E803410D20", true},  {"010C", "7E803410D20", false},
        {"010C", "7E8014141", false},      {"010C", "7E80141", false},       {"010C", "7E803420C00", false},
        {"03", "7E8024300", true},         {"0301", "7E8024300", true},      {"0701", "7E8024700", true},
        {"0A01", "7E8024A00", true},       {"0401", "7E8024400", false},     {"04", "7E80144", true},
        {"221E1C", "7E804621E1C01", true}, {"221E1C", "7E8037F2231", false}, {"010C", "7E8027F01", false},
    };
    for (Row const& row : rows) {
        EXPECT_EQ(healedOnce(std::string(row.reply) + "\r", {row.request}).answered, row.answers)
            << row.request << " " << row.reply;
    }
    EXPECT_EQ(factsOf("7E8027F78\r", {"78"}), "data irregular") << "which asks for nothing";
    EXPECT_EQ(factsOf("7E804410C1AF8\r7E8037F0178\r"), "data pending answered") << "patience behind an answer";
    EXPECT_EQ(factsOf("7E8027F78\r7E804410C1AF8\r"), "data answered irregular") << "no refusal of this request";
    EXPECT_EQ(factsOf("7E8027F01\r7E904410C1AF8\r"), "data answered irregular");
    EXPECT_EQ(factsOf("7E8047F010C78\r7E904410C1AF8\r"), "data pending answered") << "another module's patience";
}

TEST(HealedReplies, OfAnAddressByteAreShownWithoutIt)
{
    Sent const sent{"22DDBC", BusKind::Can11, true};
    EXPECT_EQ(healedOnce("607F10562DDBC0102\r", sent).text(), "6070562DDBC0102\r");
    HealedReply const two = healedOnce("607F1100862DDBC0102\r607F121030405AAAAAA\r", sent);
    EXPECT_EQ(two.text(), "607100862DDBC010203\r6072104050000000000\r");
    HealedReply const fewer = healedOnce("607F1100762DDBC0102\r607F1210304AAAAAAAA\r", sent);
    EXPECT_EQ(fewer.text(), "6070762DDBC01020304\r") << "it fits in one without";
    EXPECT_EQ(healedOnce("607F1100862DDBC0102\r", sent).text(), "") << "half a message";
}

// A lost line of one reply may come in the next: nothing but its number tells it from that one's own.
TEST(HealedReplies, OfWhichTheReplyBeforeOwesAFrameAreDoubted)
{
    std::string const first = "7E8100D490401303132\r";
    std::string const last = "7E82133343536373839\r";
    ReplyContext const context{ElmCommand("0904"), "0904", BusKind::Can11, true};
    struct Row
    {
        std::string before;
        std::string raw;
        char const* facts;
    };
    for (Row const& row :
         {Row{first, first + last, "dropped doubtful"}, Row{first + last, first + last, "data answered"},
          Row{first, last + first + last, "data answered dropped"}, Row{first, "7E803490400\r", "data answered"},
          Row{"7E9100D490401303132\r", first + last, "data answered"}}) {
        HabitCounts counts{};
        ReplyHealer healer(counts);
        healer.heal(row.before, context);
        EXPECT_EQ(factsOf(healer.heal(row.raw, context)), row.facts) << row.before << row.raw;
        EXPECT_EQ(factsOf(healer.heal(first + last, context)), "data answered") << "one reply later";
    }
}

TEST(HealedReplies, DropNothingButWhatStandsBehindDataOrAnAnswer)
{
    struct Row
    {
        char const* raw;
        char const* text;
    };
    for (Row const& row :
         {Row{"hello\rNO DATA\r", "hello\rNO DATA\r"}, Row{"hello\r7E804410C1AF8\r", "7E804410C1AF8\r"},
          Row{"7E8037F0112\rCAN ERROR\r", "7E8037F0112\rCAN ERROR\r"},
          Row{"7E8037F0112\r7E804410C1AF8\r", "7E8037F0112\r7E804410C1AF8\r"},
          Row{"7E804410C1AF8\r?\r", "7E804410C1AF8\r"}, Row{"SEARCHING...\rhello\r", "SEARCHING...\rhello\r"},
          Row{"SEARCHING...\rUNABLE TO CONNECT\r", "SEARCHING...\rUNABLE TO CONNECT\r"}}) {
        EXPECT_EQ(healedOnce(row.raw, {"010C"}).text(), row.text);
    }
}

} // namespace

} // namespace velmora
