#include "libobd/message/messageparser.h"
#include "tests/support/hexbytes.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

#include <string_view>

namespace {

using obd::ResponseMap;
using support::hexBytes;
using support::LogCapture;
using Lines = std::vector<std::string>;

class LegacyMessages : public testing::Test
{
protected:
    bool parse(obd::ObdProtocol protocol, std::string_view text)
    {
        return obd::MessageParser::parseResponseMessage(protocol, support::replyText(text), responses);
    }

    ResponseMap responses;
    LogCapture log;
};

class KwpMessages : public LegacyMessages
{
protected:
    bool parse(std::string_view text) { return LegacyMessages::parse(obd::ObdProtocolIso14230, text); }
};

// ISO 9141 and J1850 have one header layout, so each test runs on both.
class SaeMessages : public LegacyMessages, public testing::WithParamInterface<obd::ObdProtocol>
{
protected:
    bool parse(std::string_view text) { return LegacyMessages::parse(GetParam(), text); }
};

INSTANTIATE_TEST_SUITE_P(Bus, SaeMessages, testing::Values(obd::ObdProtocolIso9141, obd::ObdProtocolJ1850));

TEST_F(KwpMessages, TheByteBehindThePayloadIsDroppedAsChecksum)
{
    EXPECT_TRUE(parse("83 F1 10 41 0D 37 09"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 0D 37")}}));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(KwpMessages, AFrameThatEndsTheTextNeedsNoChecksum)
{
    EXPECT_TRUE(parse("83 F1 10 41 0D 37"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 0D 37")}}));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(KwpMessages, FramesOfOneModuleAreJoinedInOrderOfArrival)
{
    EXPECT_TRUE(parse("87 F1 10 49 02 01 00 00 00 31 06  87 F1 10 49 02 02 44 34 47 50 1E"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("49 02 01 00 00 00 31 49 02 02 44 34 47 50")}}));
}

TEST_F(KwpMessages, FramesOfTwoModulesAreKeptApartThoughInterleaved)
{
    EXPECT_TRUE(parse("82 F1 18 01 02 00  82 F1 12 11 12 00  82 F1 18 03 04 00  82 F1 12 13 14 00"));
    EXPECT_EQ(responses, (ResponseMap{{0x12, hexBytes("11 12 13 14")}, {0x18, hexBytes("01 02 03 04")}}));
}

TEST_F(KwpMessages, BadFormatBitsAreCarriedOnWith)
{
    EXPECT_TRUE(parse("03 F1 10 41 0D 37 00"));
    EXPECT_TRUE(parse("C3 F1 11 41 0D 37 00"));
    EXPECT_TRUE(parse("43 F1 12 41 0D 37 00"));
    EXPECT_EQ(responses,
              (ResponseMap{{0x10, hexBytes("41 0D 37")}, {0x11, hexBytes("41 0D 37")}, {0x12, hexBytes("41 0D 37")}}));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(KwpMessages, ALengthOfNoneHasNoSpecialMeaning)
{
    EXPECT_TRUE(parse("80 F1 10 03 82 F1 11 41 0D 00"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, {}}, {0x11, hexBytes("41 0D")}}));
    responses.clear();
    EXPECT_TRUE(parse("80 F1 10"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, {}}}));
}

TEST_F(KwpMessages, TheLongestFrameHas63Bytes)
{
    std::string const payload(2 * 63, '5');
    EXPECT_TRUE(parse("BF F1 10" + payload + "00"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, std::vector<unsigned char>(63, 0x55)}}));
}

TEST_F(KwpMessages, LessThanAHeaderFails)
{
    EXPECT_FALSE(parse("83 F1"));
    EXPECT_EQ(responses, ResponseMap());
    EXPECT_EQ(log.lines(), Lines{"ERROR Not enough data left: 2"});
    log.clear();
    EXPECT_FALSE(parse(""));
    EXPECT_EQ(log.lines(), Lines{"ERROR Not enough data left: 0"});
}

TEST_F(KwpMessages, LessThanAHeaderBehindAGoodFrameCostsNothing)
{
    EXPECT_TRUE(parse("82 F1 10 41 0D 00  82"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 0D")}}));
    EXPECT_EQ(log.lines(), Lines{"ERROR Not enough data left: 1"});
}

TEST_F(KwpMessages, AFrameThatRunsPastTheEndFails)
{
    EXPECT_FALSE(parse("86 F1 10 41 00 BE"));
    EXPECT_EQ(responses, ResponseMap());
    EXPECT_EQ(log.lines(), Lines{"ERROR Not enough data: 3 vs 6"});
}

TEST_F(KwpMessages, AFrameThatRunsPastTheEndCostsOnlyThatFrame)
{
    EXPECT_TRUE(parse("82 F1 10 41 0D 00  86 F1 11 41 00 BE"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 0D")}}));
    EXPECT_EQ(log.lines(), Lines{"ERROR Not enough data: 3 vs 6"});
}

TEST_F(KwpMessages, AnOddLastCharacterIsIgnored)
{
    EXPECT_TRUE(parse("82 F1 10 41 0D 0"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 0D")}}));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(KwpMessages, LettersThatAreNoDigitsAreReadByTheConvertersRule)
{
    EXPECT_TRUE(parse("82 XX 1Y 4Z ZZ"));
    EXPECT_EQ(responses, (ResponseMap{{0x01, hexBytes("04 00")}}));
}

TEST_F(KwpMessages, EntriesOfOtherModulesStayAndTheModulesOwnIsReplaced)
{
    responses = {{0x10, hexBytes("01")}, {0x11, hexBytes("02")}};
    EXPECT_TRUE(parse("82 F1 10 41 0D 00"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 0D")}, {0x11, hexBytes("02")}}));
}

TEST_F(KwpMessages, EarlierEntriesDoNotMakeAnUnreadableReplyUsable)
{
    responses = {{0x10, hexBytes("01")}};
    EXPECT_FALSE(parse("86 F1"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("01")}}));
}

TEST_P(SaeMessages, TheChecksumStaysOnThePayload)
{
    EXPECT_TRUE(parse("48 6B 10 41 0D 37 7B"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 0D 37 7B")}}));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_P(SaeMessages, ASecondLineOfTheSameModuleIsJoined)
{
    EXPECT_TRUE(parse("48 6B 10 41 00 7A 3F  48 6B 10 41 20 11 22"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 00 7A 3F 41 20 11 22")}}));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_P(SaeMessages, ASecondLineOfAnotherModuleIsAnEntryOfItsOwn)
{
    EXPECT_TRUE(parse("48 6B 10 41 00 7A 3F  48 6B 17 41 20 11 22"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 00 7A 3F")}, {0x17, hexBytes("41 20 11 22")}}));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_P(SaeMessages, LinesOfTwoModulesMayBeInterleaved)
{
    EXPECT_TRUE(parse("48 6B 10 01 02  48 6B 17 11 12  48 6B 10 03 04  48 6B 17 13 14"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("01 02 03 04")}, {0x17, hexBytes("11 12 13 14")}}));
}

TEST_P(SaeMessages, AnotherHeaderIsNotSeenAndStaysInThePayload)
{
    EXPECT_TRUE(parse("48 6B 10 41 0D 37 7B  48 6C 17 41 0D"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 0D 37 7B 48 6C 17 41 0D")}}));
}

TEST_P(SaeMessages, AHeaderInsideThePayloadCutsIt)
{
    EXPECT_TRUE(parse("48 6B 10 41 48 6B 22 37 7B"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41")}, {0x22, hexBytes("37 7B")}}));
}

TEST_P(SaeMessages, AHeaderWithoutRoomForItsThirdByteIsPayload)
{
    EXPECT_TRUE(parse("48 6B 10 41 0D 48 6B"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 0D 48 6B")}}));
    responses.clear();
    EXPECT_TRUE(parse("48 6B 10 41 0D 48"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 0D 48")}}));
    EXPECT_EQ(log.lines(), Lines());
}

TEST_P(SaeMessages, AHeaderWithNothingBehindItIsNoFrame)
{
    EXPECT_TRUE(parse("48 6B 10 41 0D 48 6B 17"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 0D")}}));
    EXPECT_EQ(log.lines(), Lines{"ERROR Not enought data left: 3"});
}

TEST_P(SaeMessages, TwoHeadersInARowGiveAnEmptyPayload)
{
    EXPECT_TRUE(parse("48 6B 10  48 6B 17 41"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, {}}, {0x17, hexBytes("41")}}));
}

TEST_P(SaeMessages, ATextOfThreeBytesOnlyFails)
{
    EXPECT_FALSE(parse("48 6B 10"));
    EXPECT_EQ(responses, ResponseMap());
    EXPECT_EQ(log.lines(), Lines{"ERROR Not enought data left: 3"});
}

TEST_P(SaeMessages, AnEmptyTextFails)
{
    EXPECT_FALSE(parse(""));
    EXPECT_EQ(log.lines(), Lines{"ERROR Not enought data left: 0"});
}

TEST_P(SaeMessages, AnOddLastCharacterIsIgnored)
{
    EXPECT_TRUE(parse("48 6B 10 41 0D 3"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 0D")}}));
    EXPECT_FALSE(parse("48 6B 10 4"));
}

TEST_P(SaeMessages, LettersThatAreNoDigitsAreReadByTheConvertersRule)
{
    EXPECT_TRUE(parse("4G 6B XX 4Z ZZ"));
    EXPECT_EQ(responses, (ResponseMap{{0x00, hexBytes("04 00")}}));
}

TEST_P(SaeMessages, EntriesOfOtherModulesStayAndTheModulesOwnIsReplaced)
{
    responses = {{0x10, hexBytes("01")}, {0x11, hexBytes("02")}};
    EXPECT_TRUE(parse("48 6B 10 41 0D"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("41 0D")}, {0x11, hexBytes("02")}}));
}

// The services a tool asks a module for, 01 to 0A.
constexpr unsigned char services[] = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10};

std::string hex(unsigned char byte)
{
    constexpr char digits[] = "0123456789ABCDEF";
    return {digits[byte >> 4], digits[byte & 0xF]};
}

std::string pendingFor(unsigned char service)
{
    return "7F" + hex(service) + "78";
}

std::string answerOf(unsigned char service)
{
    return hex(service | 0x40) + "0102";
}

TEST_F(KwpMessages, AnAnswerTakesThePlaceOfTheResponsePending)
{
    for (unsigned char const service : services) {
        std::string const pending = "83F110" + pendingFor(service) + "CC";
        std::string const answer = "83F110" + answerOf(service) + "CC";
        EXPECT_TRUE(parse(pending + answer));
        EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes(answerOf(service))}})) << int(service);
        EXPECT_TRUE(parse(pending + pending + answer + answer)) << "asked twice, answered in two frames";
        EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes(answerOf(service) + answerOf(service))}})) << int(service);
        EXPECT_TRUE(parse(pending));
        EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes(pendingFor(service))}})) << "no answer came";
        EXPECT_TRUE(parse(pending + "83F1107F" + hex(service) + "22CC"));
        EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("7F" + hex(service) + "22")}})) << "refused in the end";
    }
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(KwpMessages, OnlyAWholeResponsePendingGivesWay)
{
    for (std::string const first : {"7F0922", "7F0978CC", "7F09", "490278", ""}) {
        responses.clear();
        std::string const length = hex(static_cast<unsigned char>(0x80 + first.size() / 2));
        EXPECT_TRUE(parse(length + "F110" + first + "00" + "82F110490200"));
        EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes(first + "4902")}})) << first;
    }
}

TEST_F(KwpMessages, AResponsePendingIsItsOwnModulesAffair)
{
    EXPECT_TRUE(parse("83 F1 10 7F 09 78 00  82 F1 18 49 02 00  83 F1 18 7F 09 78 00  82 F1 10 49 04 00"));
    EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("49 04")}, {0x18, hexBytes("49 02 7F 09 78")}}));
}

class Iso9141Messages : public LegacyMessages
{
protected:
    bool parse(std::string_view text) { return LegacyMessages::parse(obd::ObdProtocolIso9141, text); }
};

TEST_F(Iso9141Messages, AnAnswerTakesThePlaceOfTheResponsePending)
{
    for (unsigned char const service : services) {
        for (std::string const checksum : {"", "CC"}) {
            std::string const pending = "486B10" + pendingFor(service) + checksum;
            std::string const answer = "486B10" + answerOf(service) + checksum;
            std::string const payload = answerOf(service) + checksum;
            EXPECT_TRUE(parse(pending + answer));
            EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes(payload)}})) << int(service) << checksum;
            EXPECT_TRUE(parse(pending + pending + answer + answer)) << "asked twice, answered in two frames";
            EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes(payload + payload)}})) << int(service) << checksum;
            EXPECT_TRUE(parse(pending));
            EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes(pendingFor(service) + checksum)}})) << "no answer came";
        }
    }
    EXPECT_EQ(log.lines(), Lines());
}

TEST_F(Iso9141Messages, OnlyAWholeResponsePendingGivesWay)
{
    for (std::string const first : {"7F0922CC", "7F0978CCDD", "7F09", "490278CC"}) {
        responses.clear();
        EXPECT_TRUE(parse("486B10" + first + "486B104902CC"));
        EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes(first + "4902CC")}})) << first;
    }
}

TEST_F(LegacyMessages, J1850KnowsNoResponsePending)
{
    for (std::string const checksum : {"", "CC"}) {
        responses.clear();
        EXPECT_TRUE(parse(obd::ObdProtocolJ1850, "486B107F0978" + checksum + "486B104902" + checksum));
        EXPECT_EQ(responses, (ResponseMap{{0x10, hexBytes("7F0978" + checksum + "4902" + checksum)}}));
    }
}

} // namespace
