#include "libobd/message/canresponse.h"
#include "tests/support/hexbytes.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <optional>
#include <string_view>
#include <utility>

namespace {

using obd::CanResponse;
using support::hexBytes;
using support::LogCapture;
using Bytes = std::vector<unsigned char>;
using Lines = std::vector<std::string>;

class CanResponseTest : public testing::Test
{
protected:
    int parse(std::string_view frame) { return response.parse(hexBytes(frame)); }

    // A consecutive frame whose seven data bytes all have one value.
    int consecutive(unsigned int sequence, unsigned char fill)
    {
        Bytes frame(8, fill);
        frame[0] = static_cast<unsigned char>(0x20 | (sequence & 0x0F));
        return response.parse(frame);
    }

    int first(unsigned int length)
    {
        return response.parse(
            {static_cast<unsigned char>(0x10 | length >> 8), static_cast<unsigned char>(length), 1, 2, 3, 4, 5, 6});
    }

    std::optional<Bytes> payload() const
    {
        Bytes out;
        return response.payload(out) ? std::optional(out) : std::nullopt;
    }

    CanResponse response;
    LogCapture log;
};

// The fill value of slot n in the helpers below.
unsigned char fillOf(unsigned int slot)
{
    return static_cast<unsigned char>(slot % 251 + 1);
}

// The message that a first frame of the helper and the slots in order make up.
Bytes message(unsigned int length)
{
    Bytes result = {1, 2, 3, 4, 5, 6};
    for (unsigned int slot = 0; result.size() < length; ++slot) {
        result.insert(result.end(), 7, fillOf(slot));
    }
    result.resize(length);
    return result;
}

TEST_F(CanResponseTest, ANewObjectCountsAsACompleteEmptyMessage)
{
    EXPECT_EQ(payload(), Bytes());
}

TEST_F(CanResponseTest, EmptyInputIsRejectedWithoutALine)
{
    EXPECT_EQ(response.parse(Bytes()), -1);
    EXPECT_EQ(log.lines(), Lines());
    EXPECT_EQ(payload(), Bytes());
}

TEST_F(CanResponseTest, FrameTypes3To15AreRejectedWithoutALine)
{
    for (unsigned int type = 3; type <= 15; ++type) {
        Bytes frame(8, 0x00);
        frame[0] = static_cast<unsigned char>(type << 4 | 2);
        EXPECT_EQ(response.parse(frame), -1) << type;
    }
    EXPECT_EQ(log.lines(), Lines());
    EXPECT_EQ(payload(), Bytes());
}

TEST_F(CanResponseTest, SingleFrameWithoutPadding)
{
    EXPECT_EQ(parse("03 41 0D 37"), 4);
    EXPECT_EQ(payload(), hexBytes("41 0D 37"));
}

TEST_F(CanResponseTest, SingleFrameOfSevenBytesIsWholeWithoutAPaddingSearch)
{
    EXPECT_EQ(parse("07 41 02 03 04 05 06 07 00"), 8);
    EXPECT_EQ(payload(), hexBytes("41 02 03 04 05 06 07"));
}

TEST_F(CanResponseTest, SingleFrameSwallowsTheFourPaddingValues)
{
    EXPECT_EQ(parse("03 41 0D 37 00 00 00 00"), 8);
    EXPECT_EQ(parse("03 41 0D 37 AA AA AA AA"), 8);
    EXPECT_EQ(parse("03 41 0D 37 FF FF FF FF"), 8);
    EXPECT_EQ(parse("03 41 0D 37 55 55 55 55"), 8);
    EXPECT_EQ(parse("03 41 0D 37 00 AA FF 55"), 8);
}

TEST_F(CanResponseTest, SingleFramePaddingStopsAtEightBytes)
{
    EXPECT_EQ(parse("03 41 0D 37 00 00 00 00 00 00"), 8);
}

TEST_F(CanResponseTest, SingleFramePaddingStopsAtTheEndOfTheInput)
{
    EXPECT_EQ(parse("03 41 0D 37 00 00"), 6);
}

TEST_F(CanResponseTest, SingleFramePaddingStopsAtAnyOtherByte)
{
    EXPECT_EQ(parse("03 41 0D 37 CC CC CC CC"), 4);
    EXPECT_EQ(parse("03 41 0D 37 00 7E 80 00"), 5);
}

TEST_F(CanResponseTest, SingleFrameOfLengthNone)
{
    EXPECT_EQ(parse("00"), 1);
    EXPECT_EQ(payload(), Bytes());
    EXPECT_EQ(parse("00 00 00 00 00 00 00 00"), 8);
}

TEST_F(CanResponseTest, ASingleFrameWithLowNibble9AndNineBytesIsAcceptedWithoutAPaddingSearch)
{
    EXPECT_EQ(parse("09 01 02 03 04 05 06 07 08 09 00 00"), 10);
    EXPECT_EQ(payload(), hexBytes("01 02 03 04 05 06 07 08 09"));
}

TEST_F(CanResponseTest, SingleFrameOfFifteenBytesIsTheLongest)
{
    EXPECT_EQ(parse("0F 01 02 03 04 05 06 07 08 09 0A 0B 0C 0D 0E 0F"), 16);
    EXPECT_EQ(payload()->size(), 15U);
    EXPECT_EQ(CanResponse::MaxFrameBytes, 16U);
}

TEST_F(CanResponseTest, SingleFrameThatIsCutIsRejectedAndLeavesTheMessageIncomplete)
{
    EXPECT_EQ(parse("04 41 0C 1A"), -1);
    EXPECT_EQ(log.lines(), Lines{"ERROR Not enough data"});
    EXPECT_EQ(payload(), std::nullopt);
}

TEST_F(CanResponseTest, ASecondSingleFrameReplacesTheFirst)
{
    parse("03 41 0D 37");
    parse("04 41 0C 1A F8");
    EXPECT_EQ(payload(), hexBytes("41 0C 1A F8"));
}

TEST_F(CanResponseTest, AFrameReachesAsFarAsItsPciByteTells)
{
    for (unsigned char const pci : hexBytes("00 03 07 10 1F 21 2F 30 FF")) {
        EXPECT_EQ(CanResponse::reach(pci), 8U) << static_cast<int>(pci);
    }
    EXPECT_EQ(CanResponse::reach(0x08), 9U);
    EXPECT_EQ(CanResponse::reach(0x0F), CanResponse::MaxFrameBytes);
}

TEST_F(CanResponseTest, AMessageCanBeMovedOut)
{
    Bytes out = hexBytes("EE");
    first(20);
    EXPECT_FALSE(std::move(response).payload(out));
    EXPECT_EQ(out, hexBytes("EE"));
    parse("03 41 0D 37");
    EXPECT_TRUE(std::move(response).payload(out));
    EXPECT_EQ(out, hexBytes("41 0D 37"));
}

TEST_F(CanResponseTest, PayloadLeavesTheTargetAloneWhileIncomplete)
{
    first(20);
    Bytes out = hexBytes("EE");
    EXPECT_FALSE(response.payload(out));
    EXPECT_EQ(out, hexBytes("EE"));
}

TEST_F(CanResponseTest, AFirstFrameOfLength6IsCompleteAtOnce)
{
    EXPECT_EQ(first(6), 8);
    EXPECT_EQ(payload(), hexBytes("01 02 03 04 05 06"));
}

TEST_F(CanResponseTest, ConsecutiveFramesBehindALength6MessageHaveNoMarksAndNoData)
{
    first(6);
    EXPECT_EQ(consecutive(1, 0x77), 8);
    EXPECT_EQ(consecutive(1, 0x77), 8);
    EXPECT_EQ(payload(), hexBytes("01 02 03 04 05 06"));
    EXPECT_EQ(consecutive(2, 0x77), -1);
    EXPECT_EQ(consecutive(0, 0x77), -1);
    EXPECT_EQ(log.lines(), (Lines{"ERROR Too much data incoming (13) vs length info (6)",
                                  "ERROR Too much data incoming (4294967295) vs length info (6)"}));
}

TEST_F(CanResponseTest, AFirstFrameOfLength20ExpectsTwoFramesTheLastWithSevenBytes)
{
    EXPECT_EQ(first(20), 8);
    EXPECT_EQ(payload(), std::nullopt);
    EXPECT_EQ(parse("21 11 12 13 14 15 16 17"), 8);
    EXPECT_EQ(payload(), std::nullopt);
    EXPECT_EQ(parse("22 21 22 23 24 25 26 27"), 8);
    EXPECT_EQ(payload(), hexBytes("01 02 03 04 05 06 11 12 13 14 15 16 17 21 22 23 24 25 26 27"));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(CanResponseTest, AFirstFrameOfLength19TakesSixBytesOfTheLast)
{
    EXPECT_EQ(first(19), 8);
    parse("21 11 12 13 14 15 16 17");
    EXPECT_EQ(parse("22 21 22 23 24 25 26 AA"), 8);
    EXPECT_EQ(payload(), hexBytes("01 02 03 04 05 06 11 12 13 14 15 16 17 21 22 23 24 25 26"));
}

TEST_F(CanResponseTest, AFirstFrameTakesEightBytesOfALongerInput)
{
    EXPECT_EQ(parse("10 14 01 02 03 04 05 06 7E 82 11"), 8);
}

TEST_F(CanResponseTest, AFirstFrameOfFewerThanEightBytesIsRejectedBeforeItsLengthIsRead)
{
    EXPECT_EQ(parse("10 14 01 02 03 04 05"), -1);
    EXPECT_EQ(log.lines(), Lines{"ERROR Not enough data"});
    EXPECT_EQ(payload(), Bytes());
}

TEST_F(CanResponseTest, AFirstFrameWithALengthBelow6IsRejectedAndIncomplete)
{
    EXPECT_EQ(parse("10 05 01 02 03 04 05 06"), -1);
    EXPECT_EQ(log.lines(), Lines{"ERROR Invalid response length: 5"});
    EXPECT_EQ(payload(), std::nullopt);
}

TEST_F(CanResponseTest, AFirstFrameOfLengthNoneIsRejectedAndStaysEmpty)
{
    EXPECT_EQ(parse("10 00 01 02 03 04 05 06"), -1);
    EXPECT_EQ(log.lines(), Lines{"ERROR Invalid response length: 0"});
    EXPECT_EQ(payload(), Bytes());
}

TEST_F(CanResponseTest, TheOrderFirst22And21GivesTheSameBytes)
{
    first(20);
    parse("22 21 22 23 24 25 26 27");
    parse("21 11 12 13 14 15 16 17");
    EXPECT_EQ(payload(), hexBytes("01 02 03 04 05 06 11 12 13 14 15 16 17 21 22 23 24 25 26 27"));
}

TEST_F(CanResponseTest, SequenceNumbersWrapAndFillTheSlots0To16InOrder)
{
    EXPECT_EQ(first(6 + 17 * 7), 8);
    for (unsigned int slot = 0; slot < 17; ++slot) {
        EXPECT_EQ(consecutive(slot + 1, fillOf(slot)), 8) << slot;
    }
    EXPECT_EQ(payload(), message(6 + 17 * 7));
}

TEST_F(CanResponseTest, MessagesOfEveryLengthComeTogetherInOrder)
{
    for (unsigned int length = 6; length <= 4095; length += length < 300 ? 1 : 97) {
        response = CanResponse();
        ASSERT_EQ(first(length), 8);
        for (unsigned int slot = 0; 6 + 7 * slot < length; ++slot) {
            ASSERT_EQ(consecutive(slot + 1, fillOf(slot)), 8) << length;
        }
        ASSERT_EQ(payload(), message(length)) << length;
    }
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(CanResponseTest, TheLongestMessageHas585FramesTheLastWithOneByte)
{
    first(4095);
    for (unsigned int slot = 0; slot < 584; ++slot) {
        ASSERT_EQ(consecutive(slot + 1, fillOf(slot)), 8);
    }
    EXPECT_EQ(payload(), std::nullopt);
    EXPECT_EQ(consecutive(585, fillOf(584)), 8);
    EXPECT_EQ(payload(), message(4095));
}

TEST_F(CanResponseTest, TheThirdFrameWithSequenceNumber0LandsOnSlot47)
{
    first(4095);
    for (unsigned int const slot : {15U, 31U, 47U}) {
        EXPECT_EQ(consecutive(0, fillOf(slot)), 8);
    }
    for (unsigned int slot = 0; slot < 585; ++slot) {
        if (slot != 15 && slot != 31 && slot != 47) {
            ASSERT_EQ(consecutive(slot + 1, fillOf(slot)), 8);
        }
    }
    EXPECT_EQ(payload(), message(4095));
}

TEST_F(CanResponseTest, ASequenceNumberIsTriedInThirtyNineRoundsOfTheLongestMessage)
{
    first(4095);
    for (int round = 0; round < 37; ++round) {
        ASSERT_EQ(consecutive(1, 0x77), 8);
    }
    EXPECT_EQ(consecutive(1, 0x77), -1);
    EXPECT_EQ(log.lines(), Lines{"ERROR Too much data incoming (4262) vs length info (4095)"});
}

TEST_F(CanResponseTest, SequenceNumber0OfAMessageOfFifteenFramesIsTooMuchData)
{
    first(6 + 15 * 7);
    EXPECT_EQ(consecutive(0, 0x77), -1);
    EXPECT_EQ(log.lines(), Lines{"ERROR Too much data incoming (4294967295) vs length info (111)"});
}

TEST_F(CanResponseTest, ARepeatedFrameOverwritesItsSlotAndCountsAgainSoThatTheMessageIsDropped)
{
    first(27);
    consecutive(1, 0x11);
    EXPECT_EQ(consecutive(1, 0x12), 8);
    consecutive(2, 0x22);
    EXPECT_EQ(payload(), hexBytes("01 02 03 04 05 06 12 12 12 12 12 12 12 22 22 22 22 22 22 22 00 00 00 00 00 00 00"));
    EXPECT_EQ(consecutive(3, 0x33), 8);
    EXPECT_EQ(payload(), std::nullopt);
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(CanResponseTest, AFrameAtTheVeryEndOfTheMessageBringsNoBytes)
{
    first(13);
    consecutive(1, 0x11);
    EXPECT_EQ(consecutive(2, 0x22), 8);
    EXPECT_EQ(payload(), hexBytes("01 02 03 04 05 06 11 11 11 11 11 11 11"));
}

TEST_F(CanResponseTest, AFrameBehindTheEndOfTheMessageIsTooMuchData)
{
    first(13);
    EXPECT_EQ(consecutive(3, 0x33), -1);
    EXPECT_EQ(log.lines(), Lines{"ERROR Too much data incoming (20) vs length info (13)"});
    EXPECT_EQ(payload(), std::nullopt);
}

TEST_F(CanResponseTest, AConsecutiveFrameAsTheVeryFirstIsRejected)
{
    EXPECT_EQ(parse("21 11 12 13 14 15 16 17"), -1);
    EXPECT_EQ(log.lines(), Lines{"ERROR Consecutive frame received before FF"});
    EXPECT_EQ(payload(), Bytes());
}

TEST_F(CanResponseTest, AConsecutiveFrameBehindAnEmptySingleFrameIsRejected)
{
    parse("00");
    EXPECT_EQ(consecutive(1, 0x11), -1);
    EXPECT_EQ(log.lines(), Lines{"ERROR Consecutive frame received before FF"});
}

TEST_F(CanResponseTest, AConsecutiveFrameBehindASingleFrameHasNoRoom)
{
    parse("03 41 0D 37");
    EXPECT_EQ(consecutive(1, 0x11), -1);
    EXPECT_EQ(log.lines(), Lines{"ERROR Too much data incoming (6) vs length info (3)"});
    EXPECT_EQ(payload(), hexBytes("41 0D 37"));
}

TEST_F(CanResponseTest, AConsecutiveFrameWithoutItsPaddingIsRejected)
{
    first(8);
    EXPECT_EQ(parse("21 11 12"), -1);
    EXPECT_EQ(log.lines(), Lines{"ERROR Not enough data"});
    EXPECT_EQ(payload(), std::nullopt);
}

TEST_F(CanResponseTest, ACutConsecutiveFrameStillMarksItsSlot)
{
    first(20);
    EXPECT_EQ(parse("21 11 12"), -1);
    log.clear();
    consecutive(1, 0x33);
    consecutive(2, 0x22);
    EXPECT_EQ(payload(), hexBytes("01 02 03 04 05 06 33 33 33 33 33 33 33 22 22 22 22 22 22 22"));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(CanResponseTest, ACutFrameInALongMessageSendsItsRepetitionToTheNextRound)
{
    first(6 + 17 * 7);
    EXPECT_EQ(parse("21 11 12"), -1);
    consecutive(1, 0x33);
    for (unsigned int slot = 1; slot < 17; ++slot) {
        consecutive(slot + 1, fillOf(slot));
    }
    Bytes expected = message(6 + 17 * 7);
    std::fill_n(expected.begin() + 6, 7, static_cast<unsigned char>(0));
    EXPECT_EQ(payload(), expected);
}

TEST_F(CanResponseTest, ASecondFirstFrameRestartsTheCountAndKeepsTheMarks)
{
    first(20);
    consecutive(1, 0x11);
    EXPECT_EQ(first(20), 8);
    EXPECT_EQ(payload(), std::nullopt);
    consecutive(1, 0x33);
    consecutive(2, 0x22);
    EXPECT_EQ(payload(), hexBytes("01 02 03 04 05 06 33 33 33 33 33 33 33 22 22 22 22 22 22 22"));
}

TEST_F(CanResponseTest, ALongerSecondFirstFrameHasNewSlotsAndNewRounds)
{
    first(13);
    consecutive(1, 0x11);
    EXPECT_EQ(consecutive(1, 0x11), 8);
    EXPECT_EQ(first(6 + 17 * 7), 8);
    for (unsigned int slot = 1; slot < 17; ++slot) {
        EXPECT_EQ(consecutive(slot + 1, fillOf(slot)), 8);
    }
    EXPECT_EQ(consecutive(1, 0x77), 8);
    EXPECT_EQ(log.lines(), Lines());
    Bytes expected = message(6 + 17 * 7);
    std::fill_n(expected.begin() + 6, 7, static_cast<unsigned char>(0x11));
    std::fill_n(expected.end() - 7, 7, static_cast<unsigned char>(0x77));
    EXPECT_EQ(payload(), expected);
}

TEST_F(CanResponseTest, ASlotOutsideAShortMessageIsFreeInALongerOne)
{
    first(13);
    EXPECT_EQ(consecutive(2, 0x77), 8);
    first(6 + 17 * 7);
    for (unsigned int slot = 0; slot < 17; ++slot) {
        EXPECT_EQ(consecutive(slot + 1, fillOf(slot)), 8);
    }
    EXPECT_EQ(payload(), message(6 + 17 * 7));
}

TEST_F(CanResponseTest, AFirstFrameBehindASingleFrameStartsAFreshMessage)
{
    parse("03 41 0D 37");
    first(13);
    consecutive(1, 0x11);
    EXPECT_EQ(payload(), hexBytes("01 02 03 04 05 06 11 11 11 11 11 11 11"));
}

TEST_F(CanResponseTest, AViewIsReadLikeAVector)
{
    Bytes const frame = hexBytes("04 41 0C 1A F8 7E 90");
    EXPECT_EQ(response.parse(obd::ByteView(frame).first(5)), 5);
    EXPECT_EQ(payload(), hexBytes("41 0C 1A F8"));
}

} // namespace
