#include "libobd/message/messageparser.h"
#include "tests/support/hexbytes.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

#include <string_view>

namespace {

using obd::ObdProtocolCan11;
using obd::ObdProtocolCan29;
using obd::ResponseMap;
using support::hexBytes;
using support::LogCapture;
using Lines = std::vector<std::string>;

Lines const noHeader = {"FATAL Failed to extract ECU id"};
Lines const noFrame = {"FATAL Failed to parse message payload", "FATAL Failed to extract message payload"};

Lines withCause(std::string const& cause)
{
    return {cause, noFrame[0], noFrame[1]};
}

class CanMessages : public testing::Test
{
protected:
    bool parse(obd::ObdProtocol protocol, std::string_view text)
    {
        return obd::MessageParser::parseResponseMessage(protocol, support::replyText(text), responses);
    }
    bool parse11(std::string_view text) { return parse(ObdProtocolCan11, text); }
    bool parse29(std::string_view text) { return parse(ObdProtocolCan29, text); }

    ResponseMap responses;
    LogCapture log;
};

TEST_F(CanMessages, SingleFrameWithoutItsEighthByte)
{
    EXPECT_TRUE(parse11("7E8 06 41 00 BE 3F A8 13"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("41 00 BE 3F A8 13")}}));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(CanMessages, SingleFrameWithNoPaddingAtAll)
{
    EXPECT_TRUE(parse11("7E8 02 41 0D"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("41 0D")}}));
}

TEST_F(CanMessages, FourZeroBytesAreEatenAsPadding)
{
    EXPECT_TRUE(parse11("7E8 03 41 0D 37 00 00 00 00"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("41 0D 37")}}));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(CanMessages, OtherPaddingIsReadAsTheHeaderOfAPhantomModule)
{
    EXPECT_TRUE(parse11("7E8 03 41 0D 37 CC CC CC CC"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("41 0D 37")}, {0xCCC, {}}}));
    EXPECT_EQ(log.lines(), noFrame);
}

TEST_F(CanMessages, ATrailingRestOf1Or2CharactersLeavesTheReplyGood)
{
    for (std::string const rest : {"7", "7E", "Z", "CC"}) {
        responses.clear();
        log.clear();
        EXPECT_TRUE(parse11("7E8 07 41 02 03 04 05 06 07" + rest));
        EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("41 02 03 04 05 06 07")}}));
        EXPECT_EQ(log.lines(), noHeader);
    }
}

TEST_F(CanMessages, ATrailingRestOfExactlyAHeaderMakesAPhantomModule)
{
    EXPECT_TRUE(parse11("7E8 07 41 02 03 04 05 06 07 7E9"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("41 02 03 04 05 06 07")}, {0x7E9, {}}}));
    EXPECT_EQ(log.lines(), noFrame);
}

TEST_F(CanMessages, AHeaderAndOneCharacterMakeAPhantomModule)
{
    EXPECT_TRUE(parse11("7E8 0"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, {}}}));
    EXPECT_EQ(log.lines(), noFrame);
}

TEST_F(CanMessages, TwoModulesAreIteratedInRisingOrderOfId)
{
    EXPECT_TRUE(parse11("7E9 03 41 0D 38 00 00 00 00 7E8 03 41 0D 37 00 00 00 00"));
    ASSERT_EQ(responses.size(), 2U);
    EXPECT_EQ(responses.begin()->first, 0x7E8U);
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("41 0D 37")}, {0x7E9, hexBytes("41 0D 38")}}));
}

// Eight modules answer at most, but nothing in a damaged reply keeps to that.
TEST_F(CanMessages, MoreThanEightModulesAreKeptApart)
{
    std::string first;
    std::string second;
    ResponseMap expected;
    for (unsigned char digit = 0; digit < 10; ++digit) {
        std::string const id = "79" + std::to_string(digit);
        first.insert(0, id + "10 07 49 02 01 00 00 0" + std::to_string(digit));
        second += id + "21 AB 00 00 00 00 00 00";
        expected[0x790U + digit] = {0x49, 0x02, 0x01, 0x00, 0x00, digit, 0xAB};
    }
    EXPECT_TRUE(parse11(first + second));
    EXPECT_EQ(responses, expected);
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(CanMessages, PaddingOfTheFirstModuleIsNotMistakenForTheSecond)
{
    EXPECT_TRUE(parse11("7E8 03 41 0D 37 7E9 03 41 0D 38"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("41 0D 37")}, {0x7E9, hexBytes("41 0D 38")}}));
}

TEST_F(CanMessages, FramesOfTwoModulesMayBeInterleaved)
{
    EXPECT_TRUE(parse11("7E8 10 0A 01 02 03 04 05 06  7E9 10 0B 11 12 13 14 15 16"
                        "7E9 21 17 18 19 1A 1B AA AA  7E8 21 07 08 09 0A 00 00 00"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("01 02 03 04 05 06 07 08 09 0A")},
                                      {0x7E9, hexBytes("11 12 13 14 15 16 17 18 19 1A 1B")}}));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(CanMessages, ConsecutiveFramesMayComeOutOfOrder)
{
    EXPECT_TRUE(parse11("7E8 10 11 01 02 03 04 05 06  7E8 22 0E 0F 10 11 00 00 00  7E8 21 07 08 09 0A 0B 0C 0D"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("01 02 03 04 05 06 07 08 09 0A 0B 0C 0D 0E 0F 10 11")}}));
}

TEST_F(CanMessages, AnIncompleteMessageIsLeftOutSilently)
{
    EXPECT_TRUE(parse11("7E8 10 14 49 02 01 31 47 31  7E9 03 41 0D 37 00 00 00 00"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E9, hexBytes("41 0D 37")}}));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(CanMessages, AReplyWithoutOneCompleteMessageIsAFailure)
{
    EXPECT_FALSE(parse11("7E8 10 14 49 02 01 31 47 31"));
    EXPECT_EQ(responses, ResponseMap());
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(CanMessages, ARepeatedConsecutiveFrameDropsTheMessage)
{
    EXPECT_FALSE(parse11("7E8 10 0D 01 02 03 04 05 06  7E8 21 07 08 09 0A 0B 0C 0D  7E8 21 07 08 09 0A 0B 0C 0D"));
    EXPECT_EQ(responses, ResponseMap());
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(CanMessages, AConsecutiveFrameAsTheVeryFirstCutsTheReply)
{
    EXPECT_TRUE(parse11("7E9 03 41 0D 37 00 00 00 00  7E8 21 07 08 09 0A 0B 0C 0D  7EA 02 41 0D"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, {}}, {0x7E9, hexBytes("41 0D 37")}}));
    EXPECT_EQ(log.lines(), withCause("ERROR Consecutive frame received before FF"));
}

TEST_F(CanMessages, FrameTypes3To15CutTheReplyWithTheParsersLinesOnly)
{
    for (char const type : {'3', '4', '5', '6', '7', '8', '9', 'A', 'B', 'C', 'D', 'E', 'F'}) {
        responses.clear();
        log.clear();
        EXPECT_TRUE(parse11(std::string("7E8") + type + "0 00 00 00 00 00 00 00")) << type;
        EXPECT_EQ(responses, (ResponseMap{{0x7E8, {}}})) << type;
        EXPECT_EQ(log.lines(), noFrame) << type;
    }
}

TEST_F(CanMessages, ACutSingleFrameIsLeftOut)
{
    EXPECT_FALSE(parse11("7E8 06 41 00 BE 3F"));
    EXPECT_EQ(responses, ResponseMap());
    EXPECT_EQ(log.lines(), withCause("ERROR Not enough data"));
}

TEST_F(CanMessages, ACutLastConsecutiveFrameCostsItsMessageOnly)
{
    EXPECT_TRUE(parse11("7E9 02 41 0D 00 00 00 00 00  7E8 10 08 01 02 03 04 05 06  7E8 21 07 08"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E9, hexBytes("41 0D")}}));
    EXPECT_EQ(log.lines(), withCause("ERROR Not enough data"));
}

TEST_F(CanMessages, AFirstFrameThatTellsTooLittleIsLeftOut)
{
    EXPECT_FALSE(parse11("7E8 10 05 01 02 03 04 05 06"));
    EXPECT_EQ(log.lines(), withCause("ERROR Invalid response length: 5"));
}

TEST_F(CanMessages, MoreFramesThanTheLengthTellsCutTheReplyBehindACompleteMessage)
{
    EXPECT_TRUE(parse11("7E8 10 08 01 02 03 04 05 06  7E8 21 07 08 00 00 00 00 00  7E8 23 01 02 03 04 05 06 07"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("01 02 03 04 05 06 07 08")}}));
    EXPECT_EQ(log.lines(), withCause("ERROR Too much data incoming (20) vs length info (8)"));
}

TEST_F(CanMessages, ASingleFrameMayTellUpToFifteenBytes)
{
    EXPECT_TRUE(parse11("7E8 0F 01 02 03 04 05 06 07 08 09 0A 0B 0C 0D 0E 0F  7E9 09 01 02 03 04 05 06 07 08 09"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("01 02 03 04 05 06 07 08 09 0A 0B 0C 0D 0E 0F")},
                                      {0x7E9, hexBytes("01 02 03 04 05 06 07 08 09")}}));
}

TEST_F(CanMessages, ASingleFrameMayReachIntoTheNextModulesFrame)
{
    EXPECT_TRUE(parse11("7E8 04 41 0D  7E9 03 41 0D 37"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("41 0D 7E 90")}}));
    EXPECT_EQ(log.lines(), withCause("ERROR Not enough data"));
}

TEST_F(CanMessages, ASecondAnswerOfAModuleReplacesTheFirst)
{
    EXPECT_TRUE(parse11("7E8 03 7F 01 78 00 00 00 00  7E8 03 41 0D 37 00 00 00 00"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("41 0D 37")}}));
}

TEST_F(CanMessages, LowerCaseDigitsAreDigits)
{
    EXPECT_TRUE(parse11("7e8 06 41 00 be 3f a8 13"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("41 00 BE 3F A8 13")}}));
}

TEST_F(CanMessages, LettersThatAreNoDigitsAreReadByTheConvertersRule)
{
    EXPECT_TRUE(parse11("7X8 02 4G ZZ"));
    EXPECT_EQ(responses, (ResponseMap{{0x700, hexBytes("04 00")}}));
    EXPECT_TRUE(parse11("X7Y 01 41"));
    EXPECT_EQ(responses.at(0x007), hexBytes("41"));
}

TEST_F(CanMessages, ASearchNoticeIsReadLikeAnythingElse)
{
    EXPECT_TRUE(parse11("SEARCHING... 7E8 02 41 0D"));
    // "SEA" is 0EA; "RC" tells an empty frame, whose padding goes on to ".7"; and "E80" is the next header.
    EXPECT_EQ(responses, (ResponseMap{{0x0EA, {}}, {0xE80, {}}}));
    EXPECT_EQ(log.lines(), withCause("ERROR Consecutive frame received before FF"));
}

TEST_F(CanMessages, TextShorterThanAHeaderIsAFailure)
{
    for (std::string const text : {"", "7", "7E"}) {
        log.clear();
        EXPECT_FALSE(parse11(text)) << text;
        EXPECT_EQ(responses, ResponseMap());
        EXPECT_EQ(log.lines(), noHeader);
    }
    for (std::string const text : {"", "18DAF11"}) {
        log.clear();
        EXPECT_FALSE(parse29(text)) << text;
        EXPECT_EQ(responses, ResponseMap());
        EXPECT_EQ(log.lines(), noHeader);
    }
}

TEST_F(CanMessages, A29BitIdIsFourBytes)
{
    EXPECT_TRUE(parse29("18DAF110 03 41 0D 37"));
    EXPECT_EQ(responses, (ResponseMap{{0x18DAF110, hexBytes("41 0D 37")}}));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(CanMessages, A29BitIdLosesItsTopThreeBits)
{
    EXPECT_TRUE(parse29("F8DAF110 03 41 0D 37"));
    EXPECT_EQ(responses, (ResponseMap{{0x18DAF110, hexBytes("41 0D 37")}}));
    EXPECT_TRUE(parse29("FFFFFFFF 01 41"));
    EXPECT_EQ(responses.rbegin()->first, 0x1FFFFFFFU);
}

TEST_F(CanMessages, An11BitIdIsThreeDigitsWhateverTheyAre)
{
    EXPECT_TRUE(parse11("FFF 01 41"));
    EXPECT_EQ(responses, (ResponseMap{{0xFFF, hexBytes("41")}}));
}

TEST_F(CanMessages, Two29BitModulesWithPaddingAndALongMessage)
{
    EXPECT_TRUE(parse29("18DAF11D 03 41 0D 37 55 55 55 55  18DAF110 10 0A 01 02 03 04 05 06"
                        "18DAF110 21 07 08 09 0A 55 55 55"));
    EXPECT_EQ(responses, (ResponseMap{{0x18DAF110, hexBytes("01 02 03 04 05 06 07 08 09 0A")},
                                      {0x18DAF11D, hexBytes("41 0D 37")}}));
}

TEST_F(CanMessages, A29BitRestShorterThanAHeaderLeavesTheReplyGood)
{
    EXPECT_TRUE(parse29("18DAF110 07 41 02 03 04 05 06 07 CCCCCCC"));
    EXPECT_EQ(responses.size(), 1U);
    EXPECT_EQ(log.lines(), noHeader);
}

TEST_F(CanMessages, EntriesOfOtherModulesStayAndTheModulesOwnIsReplaced)
{
    responses = {{0x7E8, hexBytes("01 02")}, {0x7E9, hexBytes("03")}};
    EXPECT_TRUE(parse11("7E8 02 41 0D"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("41 0D")}, {0x7E9, hexBytes("03")}}));
}

TEST_F(CanMessages, AnEntryThatWasThereBeforeMakesAReplyWithoutCompleteMessagesUsable)
{
    responses = {{0x7E9, hexBytes("03")}};
    EXPECT_TRUE(parse11("7E8 10 14 49 02 01 31 47 31"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E9, hexBytes("03")}}));
}

TEST_F(CanMessages, AnUnreadableReplyLeavesEarlierEntriesAndFails)
{
    responses = {{0x7E9, hexBytes("03")}};
    EXPECT_FALSE(parse11("7E"));
    EXPECT_EQ(responses, (ResponseMap{{0x7E9, hexBytes("03")}}));
}

} // namespace
