#include "libvelmora/channel/bringupmemory.h"
#include "libvelmora/channel/replyhealer.h"

#include <gtest/gtest.h>

namespace velmora {

namespace {

struct HabitCase
{
    char const* why;
    BusKind bus;
    char const* request;
    char const* raw;
    char const* expected;
    Habit habit;
};

// Replies as they were seen on real adapters and cars, or built by the rules of the buses.
HabitCase const habitCases[] = {
    {"an echo that stays on", BusKind::Can11, "010C", "010C\r7E804410C1AF8\r\r", "7E804410C1AF8\r", Habit::Echo},
    {"a search in front", BusKind::Can11, "0100", "SEARCHING...\r7E8064100BE3EA813\r\r", "7E8064100BE3EA813\r",
     Habit::Notice},
    {"a search on the same line", BusKind::Can11, "010C", "SEARCHING...7E804410C1AF8\r\r", "7E804410C1AF8\r",
     Habit::Notice},
    {"a slow bus start", BusKind::Iso9141, "0100", "BUS INIT: ...OK\r486B104100BE3EB811AA\r\r",
     "486B104100BE3EB811AA\r", Habit::Notice},
    {"a lone OK behind the search", BusKind::Kwp, "0100", "SEARCHING...\rOK\r86F1114100BE3EB81134\r\r",
     "86F1114100BE3EB81134\r", Habit::Notice},
    {"line feeds, and a junk byte on a line of its own", BusKind::Can11, "010C", "\xFC\r\n7E804410C1AF8\r\n\r\n",
     "7E804410C1AF8\r", Habit::StrayBytes},
    {"unpadded frames of two modules, mixed", BusKind::Can11, "0904",
     "7E8100F490401303132\r7E9100F490401413132\r7E82133343536373839\r7E92133343536373839\r7E8223031\r7E9223031\r\r",
     "7E8100F490401303132\r7E9100F490401413132\r7E82133343536373839\r7E92133343536373839\r"
     "7E82230310000000000\r7E92230310000000000\r",
     Habit::ShortLastFrame},
    {"a junk byte inside a line that is whole without it", BusKind::Can11, "010C",
     "7E80441\xFE\x30\x43\x31\x41\x46\x38"
     "000000\r\r",
     "7E804410C1AF8\r", Habit::StrayBytes},
    {"a junk byte that may stand for a lost one", BusKind::Can11, "010C", "7E80441\xFE\x30\x43\x31\x41\x46\x38\r\r", "",
     Habit::BrokenLine},
    {"half a byte is lost", BusKind::Can11, "010C", "7E804410C1AF\r7E904410C1B00\r\r", "7E904410C1B00\r",
     Habit::BrokenLine},
    {"fewer bytes than the PCI tells", BusKind::Can29, "010C", "18DAF11004410C1A\r\r", "", Habit::BrokenLine},
    {"a KWP line of another length than it tells", BusKind::Kwp, "010C", "84F110410C1A\r\r", "", Habit::BrokenLine},
    {"a flagged line", BusKind::J1850, "010C", "486B10410C1AF8D5\r486B28410C1AF8D5 <DATA ERROR\r\r",
     "486B10410C1AF8D5\r", Habit::FlaggedLine},
    {"filling of CC", BusKind::Can11, "010C", "7E804410C1AF8CCCCCC\r\r", "7E804410C1AF8\r", Habit::Padding},
    {"filling that repeats a byte of data", BusKind::Can11, "010D", "7E8 03 41 0D 4A 4A\r\r", "7E803410D4A\r",
     Habit::Padding},
    {"a last frame without filling", BusKind::Can11, "0904", "7E8100F490401303132\r7E82133343536373839\r7E8223031\r\r",
     "7E8100F490401303132\r7E82133343536373839\r7E82230310000000000\r", Habit::ShortLastFrame},
    {"a last frame that lacks a told byte", BusKind::Can11, "0904",
     "7E8100F490401303132\r7E82133343536373839\r7E82230\r7E903490400\r\r",
     "7E8100F490401303132\r7E82133343536373839\r7E903490400\r", Habit::BrokenLine},
    {"frames without their beginning", BusKind::Can11, "010C", "7E82130303030303030\r7E804410C1AF8\r\r",
     "7E804410C1AF8\r", Habit::OrphanFrame},
    {"a frame with a number that its message does not reach", BusKind::Can11, "0164",
     "7E9100B416401020304\r7E9220A0B0C0D0E0F10\r7E9210506070809AAAA\r\r", "7E9100B416401020304\r7E9210506070809AAAA\r",
     Habit::OrphanFrame},
    {"a frame of a message twice", BusKind::Can11, "0904",
     "7E8100D490401303132\r7E82133343536373839\r7E82133343536373839\r\r", "7E8100D490401303132\r7E82133343536373839\r",
     Habit::RepeatedFrame},
    {"another request's late answer", BusKind::Can11, "010C", "7E803410D20\r7E804410C1AF8\r\r", "7E804410C1AF8\r",
     Habit::ForeignReply},
    {"patience asked for, then the answer", BusKind::Can11, "0904", "7E8037F0978\r7E803490400\r\r", "7E803490400\r",
     Habit::PendingReply},
    {"the same on J1850, where the request's bytes come back", BusKind::J1850, "0101",
     "486B107F01010078AA\r486B1041010007E500AA\r\r", "486B1041010007E500AA\r", Habit::PendingReply},
    {"an error word behind a good line", BusKind::Can11, "010C", "7E804410C1AF8\rCAN ERROR\r\r", "7E804410C1AF8\r",
     Habit::TrailingError},
    {"a full buffer cuts the line before", BusKind::Can11, "010C", "7E804410C1AF8\r7E904410C1A00\rBUFFER FULL\r\r",
     "7E804410C1AF8\r", Habit::BrokenLine},
};

TEST(ReplyHealer, TakesOutWhatMakesAReplyUnreadableAndCountsIt)
{
    for (HabitCase const& row : habitCases) {
        HabitCounts counts{};
        ReplyHealer healer(counts);
        HealedReply const reply = healer.heal(row.raw, {ElmCommand(row.request), row.request, row.bus, true});
        EXPECT_EQ(reply.text(), row.expected) << row.why;
        EXPECT_GT(counts[static_cast<std::size_t>(row.habit)], 0U) << row.why;
    }
}

TEST(ReplyHealer, LeavesGoodRepliesAlone)
{
    struct Good
    {
        BusKind bus;
        char const* request;
        char const* raw;
        std::size_t frames;
    };
    Good const good[] = {
        {BusKind::Can11, "010C", "7E804410C1AF8\r", 1},
        {BusKind::Can11, "0902", "7E8101449020156454C\r7E8214D524153314D4D\r7E82230303030303031\r", 3},
        // Two modules' frames mixed.
        {BusKind::Can11, "090A",
         "7E8100E490A01454341\r7E9100E490A01544341\r7E8212D00456E67696E\r7E9212D00456E67696E\r7E82265AAAAAAAAAAAA\r"
         "7E92265AAAAAAAAAAAA\r",
         6},
        {BusKind::J1850, "03", "486B1043013300000000AA\r486B1043013300000000AA\r", 2},
        {BusKind::Kwp, "0100", "86F1114100BE3EB81134\r86F1184100BE3EB8113B\r", 2},
    };
    for (Good const& row : good) {
        HabitCounts counts{};
        ReplyHealer healer(counts);
        HealedReply const reply = healer.heal(row.raw, {ElmCommand(row.request), row.request, row.bus, true});
        EXPECT_EQ(reply.text(), row.raw);
        EXPECT_TRUE(reply.whole()) << row.raw;
        EXPECT_EQ(reply.frameCount(), row.frames);
        EXPECT_EQ(counts, HabitCounts{}) << row.raw;
    }
}

TEST(ReplyHealer, WhatIsNotAWholeAnswerIsNotWhole)
{
    for (char const* raw : {"NO DATA\r", "7E8037F0112\r", "7E8037F0178\r", "7E804410C1AF8\rSTOPPED\r", "?\r",
                            "7E803410D20\r", "7E8101449020156454C\r", ""}) {
        HabitCounts counts{};
        ReplyHealer healer(counts);
        EXPECT_FALSE(healer.heal(raw, {ElmCommand("010C"), "010C", BusKind::Can11, true}).whole()) << raw;
    }
}

// A NUL means nothing by the data sheet, so that the line that it stands in is trusted.
TEST(ReplyHealer, ANulIsTakenOut)
{
    HabitCounts counts{};
    ReplyHealer healer(counts);
    std::string const raw("7E80441\0"
                          "0C1AF8\r",
                          15);
    EXPECT_EQ(healer.heal(raw, {ElmCommand("010C"), "010C", BusKind::Can11, true}).text(), "7E804410C1AF8\r");
    EXPECT_EQ(counts[static_cast<std::size_t>(Habit::StrayBytes)], 1U);
}

TEST(ReplyHealer, AFirstFrameThatComesTwiceCountsOnce)
{
    HabitCounts counts{};
    ReplyHealer healer(counts);
    std::string const first = "7E8101449020156454C\r";
    std::string const rest = "7E8214D524153314D4D\r7E82230303030303031\r";
    HealedReply const reply = healer.heal(first + first + rest, {ElmCommand("0902"), "0902", BusKind::Can11, true});
    EXPECT_EQ(reply.text(), first + rest);
    EXPECT_EQ(counts[static_cast<std::size_t>(Habit::RepeatedFrame)], 1U);
}

TEST(BringUpMemory, BeginsAnewEachTime)
{
    HabitCounts counts{};
    ReplyHealer healer(counts);
    ElmCommand const mask("0100");
    ReplyContext const context{mask, "0100", BusKind::Can11, true};
    BringUpMemory memory;
    memory.remember(mask, healer.heal("7E8064100BE3EA813\r", context));
    EXPECT_EQ(memory.recall(mask), std::nullopt) << "not begun";
    for (char const* const reply : {"7E8064100BE3EA813\r", "7E906410098188001\r"}) {
        memory.start();
        EXPECT_EQ(memory.recall(mask), std::nullopt);
        memory.remember(mask, healer.heal(reply, context));
        EXPECT_EQ(memory.recall(mask), reply) << "the vehicle may be another one";
    }
    memory.remember(ElmCommand("0120"),
                    healer.heal("7E8064120A0010001\r", {ElmCommand("0120"), "0120", BusKind::Can11, true}));
    EXPECT_EQ(memory.recall(ElmCommand("0120")), std::nullopt) << "another module has spoken";
    memory.stop();
    EXPECT_EQ(memory.recall(mask), std::nullopt);
}

TEST(BusKinds, FollowTheNumbersOfProtocols)
{
    std::vector<BusKind> kinds;
    for (int protocol = -1; protocol <= 11; ++protocol) {
        kinds.push_back(busKindOf(protocol));
    }
    EXPECT_EQ(kinds, (std::vector<BusKind>{BusKind::Unknown, BusKind::Unknown, BusKind::J1850, BusKind::J1850,
                                           BusKind::Iso9141, BusKind::Kwp, BusKind::Kwp, BusKind::Can11, BusKind::Can29,
                                           BusKind::Can11, BusKind::Can29, BusKind::Unknown, BusKind::Unknown}));
}

TEST(ElmCommands, OfOneShapeAreLiveValuesAndTheItemsOfTheStandard)
{
    for (char const* fixed : {"010C", "010C0D", "0902", "090F"}) {
        EXPECT_TRUE(ElmCommand(fixed).hasFixedShape()) << fixed;
    }
    for (char const* loose : {"0910", "09", "090204", "03", "ATI"}) {
        EXPECT_FALSE(ElmCommand(loose).hasFixedShape()) << loose;
    }
}

// Two frames with the same number and other data: nothing tells which of them is right.
TEST(ReplyHealer, AMessageWithTwoFramesForOnePlaceGoes)
{
    HabitCounts counts{};
    ReplyHealer healer(counts);
    std::string const raw = "7E8101449020156454C\r7E8214D524153314D4D\r7E82130303030303031\r7E903490200\r";
    HealedReply const reply = healer.heal(raw, {ElmCommand("0902"), "0902", BusKind::Can11, true});
    EXPECT_EQ(reply.text(), "7E903490200\r");
}

TEST(ReplyHealer, AByteLostFromALegacyLineIsToldByItsCheckByteOnceTheAdapterShowsThem)
{
    HabitCounts counts{};
    ReplyHealer healer(counts);
    ReplyContext const context{ElmCommand("010C"), "010C", BusKind::Iso9141, true};
    std::string const whole = "486B10410C1AF822\r";
    std::string const cut = "486B10410CF822\r"; // 1A is lost: F822 would be read as 15880 rpm
    EXPECT_EQ(healer.heal(cut, context).text(), cut) << "nothing tells yet";
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(healer.heal(whole, context).text(), whole);
    }
    EXPECT_EQ(healer.heal(cut, context).text(), "");
}

TEST(ReplyHealer, LinesOfOneByteEachAreLeftToTheReader)
{
    HabitCounts counts{};
    ReplyHealer healer(counts);
    std::string const raw = "48\r6B\r10\r41\r0C\r1A\rF8\r22\r";
    EXPECT_EQ(healer.heal(raw, {ElmCommand("010C"), "010C", BusKind::Iso9141, true}).text(), raw);
}

TEST(ReplyHealer, TellsAResetFromAnErrorOfTheBus)
{
    HabitCounts counts{};
    ReplyHealer healer(counts);
    ReplyContext const context{ElmCommand("010C"), "010C", BusKind::Can11, true};
    for (char const* raw : {"ELM327 v1.5\r", "LV RESET\r", "ERR94\r", "\r\rELM327 v2.1\r"}) {
        EXPECT_TRUE(healer.heal(raw, context).reset) << raw;
    }
    for (char const* raw : {"BUS ERROR\r", "CAN ERROR\r", "ERR\r", "ERRA1\r", "ERR941\r", "7E804410C1AF8\r"}) {
        EXPECT_FALSE(healer.heal(raw, context).reset) << raw;
    }
}

} // namespace

} // namespace velmora
