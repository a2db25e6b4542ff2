#include "simulator/bus/frame.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Bytes;
using obdsim::findProtocol;
using obdsim::Frame;
using obdsim::frameReply;
using obdsim::Padding;

Bytes bytes(char const* text)
{
    return *obdsim::parseHex(text);
}

/// A frame as one line: header, data, check byte.
std::string text(Frame const& frame)
{
    Bytes all = frame.header;
    all.insert(all.end(), frame.data.begin(), frame.data.end());
    if (frame.checksum) {
        all.push_back(*frame.checksum);
    }
    return obdsim::hexText(all, " ");
}

std::vector<std::string> texts(int protocol, std::uint32_t source, char const* payload, Padding padding = std::nullopt,
                               bool everyone = true)
{
    std::vector<std::string> result;
    for (auto const& frame : frameReply(*findProtocol(protocol), source, everyone, bytes(payload), padding)) {
        result.push_back(text(frame));
    }
    return result;
}

using Lines = std::vector<std::string>;

TEST(Frame, canSingleFrameHasItsLengthInFront)
{
    EXPECT_EQ(texts(6, 0x7E8, "41 00 BE 3F A8 13"), Lines{"07 E8 06 41 00 BE 3F A8 13"});
    EXPECT_EQ(texts(6, 0x7E8, "43 00"), Lines{"07 E8 02 43 00"});
    EXPECT_EQ(texts(7, 0x18DAF110, "41 0D 37"), Lines{"18 DA F1 10 03 41 0D 37"});
    EXPECT_EQ(texts(8, 0x7E9, "44"), Lines{"07 E9 01 44"});
    EXPECT_EQ(texts(6, 0x7E8, "01 02 03 04 05 06 07"), Lines{"07 E8 07 01 02 03 04 05 06 07"});
}

TEST(Frame, canFramesAreFilledUpWithPadding)
{
    EXPECT_EQ(texts(6, 0x7E8, "43 00", 0xAA), Lines{"07 E8 02 43 00 AA AA AA AA AA"});
    EXPECT_EQ(texts(9, 0x18DAF110, "43 00", 0x55), Lines{"18 DA F1 10 02 43 00 55 55 55 55 55"});
}

TEST(Frame, canMessageOfEightBytesNeedsTwoFrames)
{
    EXPECT_EQ(texts(6, 0x7E8, "01 02 03 04 05 06 07 08"), (Lines{"07 E8 10 08 01 02 03 04 05 06", "07 E8 21 07 08"}));
}

TEST(Frame, canVehicleNumberTakesThreeFrames)
{
    EXPECT_EQ(
        texts(6, 0x7E8, "49 02 01 31 4E 34 41 4C 33 41 50 37 44 30 30 30 30 30 30 30", 0x00),
        (Lines{"07 E8 10 14 49 02 01 31 4E 34", "07 E8 21 41 4C 33 41 50 37 44", "07 E8 22 30 30 30 30 30 30 30"}));
}

TEST(Frame, canLastFrameIsFilledAndThoseBeforeAreFull)
{
    // Six codes of a bench simulator: the last frame is filling, but for one byte.
    EXPECT_EQ(
        texts(6, 0x7E8, "43 06 01 00 02 00 03 00 43 00 82 00 C1 00", 0x00),
        (Lines{"07 E8 10 0E 43 06 01 00 02 00", "07 E8 21 03 00 43 00 82 00 C1", "07 E8 22 00 00 00 00 00 00 00"}));
}

TEST(Frame, canSequenceNumberWrapsFromFifteenToZero)
{
    Bytes const payload(6 + 7 * 17, 0x11);
    auto const frames = frameReply(*findProtocol(6), 0x7E8, true, payload, std::nullopt);
    ASSERT_EQ(frames.size(), 18U);
    EXPECT_EQ(frames[1].data[0], 0x21);
    EXPECT_EQ(frames[15].data[0], 0x2F);
    EXPECT_EQ(frames[16].data[0], 0x20);
    EXPECT_EQ(frames[17].data[0], 0x21);
}

TEST(Frame, kwpFormatByteHoldsTheLength)
{
    EXPECT_EQ(texts(5, 0x12, "41 00 98 3B 20 13"), Lines{"86 F1 12 41 00 98 3B 20 13 D0"});
    EXPECT_EQ(texts(4, 0x10, "43 01 00 02 00 03 00"), Lines{"87 F1 10 43 01 00 02 00 03 00 D1"});
}

TEST(Frame, kwpMessageAboveSixtyThreeBytesHasALengthByte)
{
    Bytes const payload(64, 0x00);
    auto const frames = frameReply(*findProtocol(5), 0x10, true, payload, std::nullopt);
    EXPECT_EQ(frames[0].header, (Bytes{0x80, 0xF1, 0x10, 0x40}));
}

TEST(Frame, iso9141AndJ1850DifferInHeaderAndCheckByte)
{
    EXPECT_EQ(texts(3, 0x13, "41 00 BE 1F B8 11"), Lines{"48 6B 13 41 00 BE 1F B8 11 AD"});
    EXPECT_EQ(texts(2, 0x10, "43 03 06 03 56 00 00"), Lines{"48 6B 10 43 03 06 03 56 00 00 DC"});
    EXPECT_EQ(texts(1, 0x10, "41 00 BF 9F B9 90"), Lines{"41 6B 10 41 00 BF 9F B9 90 05"});
}

TEST(Frame, physicallyAddressedJ1850HasHeadersOfItsOwn)
{
    EXPECT_EQ(texts(2, 0x10, "62 11 72 01 36", std::nullopt, false), Lines{"6C F1 10 62 11 72 01 36 EA"});
    EXPECT_EQ(texts(1, 0x10, "41 0D 00", std::nullopt, false)[0].substr(0, 8), "C4 F1 10");
}

struct TargetCase
{
    int protocol;
    char const* header;
    bool everyone;
    std::uint32_t module;
};

TargetCase const targetCases[] = {
    {6, "07 DF", true, 0},
    {6, "07 E0", false, 0x7E8},
    {6, "07 E1", false, 0x7E9},
    {7, "18 DB 33 F1", true, 0},
    {7, "18 DA 10 F1", false, 0x18DAF110},
    {5, "C0 33 F1", true, 0},
    {5, "C2 33 F1", true, 0},
    {5, "81 10 F1", false, 0x10},
    {5, "82 13 F0", false, 0x13},
    {3, "68 6A F1", true, 0},
    {2, "6C 10 F1", false, 0x10},
    {2, "68 10 F1", false, 0x10},
    {2, "6C 6A F1", false, 0x6A},
    {5, "BF 33 F1", false, 0x33},
    {1, "61 6A F1", true, 0},
    {1, "C4 10 F1", false, 0x10},
};

TEST(Frame, requestHeaderTellsWhomItIsFor)
{
    for (auto const& row : targetCases) {
        auto const target = obdsim::targetOf(*findProtocol(row.protocol), bytes(row.header));
        ASSERT_TRUE(target) << row.header;
        EXPECT_EQ(target->everyone, row.everyone) << row.header;
        EXPECT_EQ(target->module, row.module) << row.header;
    }
    auto const own = obdsim::targetOf(*findProtocol(7), bytes("10 02 40 40"));
    ASSERT_TRUE(own) << "a module may listen to it";
    EXPECT_EQ(own->identifier, 0x10024040U);
    EXPECT_EQ(own->module, 0U);
    EXPECT_FALSE(obdsim::targetOf(*findProtocol(6), bytes("18 DB 33 F1")));
}

TEST(Frame, standardHeaderReachesEveryoneOnEachProtocol)
{
    for (int number = 1; number <= 9; ++number) {
        auto const& protocol = *findProtocol(number);
        auto const target = obdsim::targetOf(protocol, obdsim::functionalHeader(protocol));
        ASSERT_TRUE(target) << number;
        EXPECT_TRUE(target->everyone) << number;
    }
    EXPECT_EQ(findProtocol(0), nullptr);
    EXPECT_EQ(findProtocol(10), nullptr);
}

TEST(Frame, requestWithoutPciByteIsNoFrame)
{
    EXPECT_EQ(obdsim::unwrapSingleFrame(bytes("02 09 02")), bytes("09 02"));
    EXPECT_EQ(obdsim::unwrapSingleFrame(bytes("02 01 0C 00 00 00 00 00")), bytes("01 0C"));
    EXPECT_EQ(obdsim::unwrapSingleFrame(bytes("01 03")), bytes("03"));
    EXPECT_EQ(obdsim::unwrapSingleFrame(bytes("07 01 02 03 04 05 06 07")), bytes("01 02 03 04 05 06 07"));
    EXPECT_FALSE(obdsim::unwrapSingleFrame(bytes("00 01 02")));
    EXPECT_FALSE(obdsim::unwrapSingleFrame(bytes("09 02")));
    EXPECT_FALSE(obdsim::unwrapSingleFrame(bytes("10 14 49 02 01 31 4E 34")));
    EXPECT_FALSE(obdsim::unwrapSingleFrame({}));
}

TEST(Frame, longMessagesHaveTwelveBitsOfLengthAndFourOfNumber)
{
    Bytes const payload(0x12C, 0x55);
    auto const frames = obdsim::frameReply(*findProtocol(6), 0x7E8, false, payload, std::uint8_t{0}, std::nullopt);
    ASSERT_EQ(frames.size(), 1 + 42U);
    EXPECT_EQ(frames[0].data, bytes("11 2C 55 55 55 55 55 55"));
    EXPECT_EQ(frames[15].data[0], 0x2F);
    EXPECT_EQ(frames[16].data[0], 0x20) << "and on from 0";
    EXPECT_EQ(frames[42].data, bytes("2A 55 55 55 55 55 55 55"));
    EXPECT_EQ(
        obdsim::frameReply(*findProtocol(6), 0x7E8, false, Bytes(301, 0), std::uint8_t{0xAA}, std::nullopt).back().data,
        bytes("2B 00 AA AA AA AA AA AA"));
}

TEST(Frame, ofAFunctionalKwpHeaderTheFirstTwoBitsTell)
{
    for (char const* const header : {"C0 11 F1", "C1 11 F1", "FF 11 F1"}) {
        EXPECT_TRUE(obdsim::targetOf(*findProtocol(5), bytes(header))->everyone) << header;
    }
    for (char const* const header : {"80 11 F1", "BF 11 F1"}) {
        EXPECT_FALSE(obdsim::targetOf(*findProtocol(5), bytes(header))->everyone) << header;
    }
}

TEST(Frame, anAddressTakesAByteOfEach)
{
    auto const lines = [](char const* payload) {
        std::vector<std::string> all;
        for (auto const& frame :
             frameReply(*findProtocol(6), 0x607, false, bytes(payload), std::uint8_t{0}, std::uint8_t{0xF1})) {
            all.push_back(obdsim::hexText(frame.data, " "));
        }
        return all;
    };
    EXPECT_EQ(lines("01 02 03 04 05 06"), Lines{"F1 06 01 02 03 04 05 06"});
    EXPECT_EQ(lines("01 02 03 04 05 06 07"), (Lines{"F1 10 07 01 02 03 04 05", "F1 21 06 07 00 00 00 00"}));
    EXPECT_EQ(lines("01 02 03 04 05 06 07 08 09 0A 0B"), (Lines{"F1 10 0B 01 02 03 04 05", "F1 21 06 07 08 09 0A 0B"}));
    EXPECT_EQ(lines("01 02 03 04 05 06 07 08 09 0A 0B 0C").size(), 3U);
}

TEST(Frame, theFormatByteTellsSixtyThreeBytes)
{
    auto const header = [](std::size_t size) {
        return frameReply(*findProtocol(5), 0x10, true, Bytes(size, 0), std::nullopt)[0].header;
    };
    EXPECT_EQ(header(63), (Bytes{0xBF, 0xF1, 0x10}));
    EXPECT_EQ(header(255), (Bytes{0x80, 0xF1, 0x10, 0xFF}));
    EXPECT_EQ(header(1), (Bytes{0x81, 0xF1, 0x10}));
}

TEST(Frame, aHeaderHasTheLengthOfItsBus)
{
    for (auto const& [protocol, header] : {std::pair{6, "07"},
                                           {6, "00 07 E0"},
                                           {7, "DA 10 F1"},
                                           {7, "07 E0"},
                                           {5, "C0 33"},
                                           {5, "C0 33 F1 00"},
                                           {2, "07 E0"}}) {
        EXPECT_FALSE(obdsim::targetOf(*findProtocol(protocol), bytes(header))) << header;
    }
    EXPECT_EQ(obdsim::targetOf(*findProtocol(6), bytes("07 DE"))->module, 0x7E6U);
    EXPECT_EQ(obdsim::targetOf(*findProtocol(6), bytes("07 DE"))->identifier, 0x7DEU);
    EXPECT_EQ(obdsim::targetOf(*findProtocol(7), bytes("18 DA 12 34"))->module, 0x18DA3412U);
    EXPECT_FALSE(obdsim::targetOf(*findProtocol(3), bytes("68 10 F1"))->everyone);
    EXPECT_FALSE(obdsim::targetOf(*findProtocol(3), bytes("48 6A F1"))->everyone);
}

} // namespace
