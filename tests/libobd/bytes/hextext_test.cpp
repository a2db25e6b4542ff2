#include "libobd/bytes/bytes.h"
#include "tests/support/hexbytes.h"

#include <gtest/gtest.h>

#include <array>
#include <cctype>

namespace {

using support::hexBytes;
using support::replyText;
using Bytes = std::vector<unsigned char>;

Bytes decoded(std::string_view text)
{
    Bytes result;
    obd::hexTextToBytes(Bytes(text.begin(), text.end()), result);
    return result;
}

std::string encoded(Bytes const& source)
{
    Bytes text;
    obd::bytesToHexText(source, text);
    return {text.begin(), text.end()};
}

TEST(HexTextToBytes, ReadsPairsOfEitherCase)
{
    EXPECT_EQ(decoded("410C1AF8"), hexBytes("41 0C 1A F8"));
    EXPECT_EQ(decoded("410c1af8"), hexBytes("41 0C 1A F8"));
    EXPECT_EQ(decoded("aFFa"), hexBytes("AF FA"));
}

TEST(HexTextToBytes, ReadsEveryByteValue)
{
    static constexpr char digits[] = "0123456789ABCDEF";
    std::string text;
    Bytes expected;
    for (int value = 0; value < 256; ++value) {
        text += {digits[value / 16], digits[value % 16]};
        expected.push_back(static_cast<unsigned char>(value));
    }
    EXPECT_EQ(decoded(text), expected);
}

TEST(HexTextToBytes, IgnoresALastSingleCharacter)
{
    EXPECT_EQ(decoded("410"), hexBytes("41"));
    EXPECT_EQ(decoded("41G"), hexBytes("41"));
}

TEST(HexTextToBytes, GivesNothingForFewerThanTwoCharacters)
{
    EXPECT_EQ(decoded(""), Bytes());
    EXPECT_EQ(decoded("4"), Bytes());
}

TEST(HexTextToBytes, APairThatBeginsWithNoDigitIsZero)
{
    EXPECT_EQ(decoded("G1"), hexBytes("00"));
    EXPECT_EQ(decoded("ZZ"), hexBytes("00"));
    EXPECT_EQ(decoded("-1"), hexBytes("00"));
    EXPECT_EQ(decoded("+5"), hexBytes("00"));
    EXPECT_EQ(decoded(" 5"), hexBytes("00"));
}

TEST(HexTextToBytes, APairWithADigitInItsFirstPlaceOnlyIsThatDigit)
{
    EXPECT_EQ(decoded("4G"), hexBytes("04"));
    EXPECT_EQ(decoded("f "), hexBytes("0F"));
    EXPECT_EQ(decoded("0x"), hexBytes("00"));
    EXPECT_EQ(decoded("5."), hexBytes("05"));
}

TEST(HexTextToBytes, KnowsTheDigitsAmongAllCharacters)
{
    for (int character = 0; character < 256; ++character) {
        Bytes result;
        obd::hexTextToBytes(Bytes{'1', static_cast<unsigned char>(character)}, result);
        ASSERT_EQ(result.size(), 1U);
        EXPECT_EQ(result[0] >= 0x10, std::isxdigit(character) != 0) << character;
    }
}

TEST(HexTextToBytes, AppendsToWhatIsThere)
{
    Bytes result = hexBytes("7F");
    obd::hexTextToBytes(replyText("01 12"), result);
    EXPECT_EQ(result, hexBytes("7F 01 12"));
}

TEST(HexTextToBytes, FillsNoMoreThanTheRoomGiven)
{
    Bytes const text = replyText("41 0C 1A F8");
    std::array<unsigned char, 3> room = {0xEE, 0xEE, 0xEE};
    EXPECT_EQ(obd::hexTextToBytes(text, std::span(room).first(2)), 2U);
    EXPECT_EQ(room, (std::array<unsigned char, 3>{0x41, 0x0C, 0xEE}));
    EXPECT_EQ(obd::hexTextToBytes(std::span(text).first(5), room), 2U);
}

TEST(BytesToHexText, WritesTwoUpperCaseDigitsWithoutSeparators)
{
    EXPECT_EQ(encoded(hexBytes("01 0c ab ff 00")), "010CABFF00");
    EXPECT_EQ(encoded({}), "");
}

TEST(BytesToHexText, AppendsToWhatIsThere)
{
    Bytes text = replyText("01");
    obd::bytesToHexText(hexBytes("0D"), text);
    EXPECT_EQ(text, replyText("010D"));
}

TEST(BytesToHexText, IsUndoneByDecoding)
{
    Bytes all;
    for (int value = 0; value < 256; ++value) {
        all.push_back(static_cast<unsigned char>(value));
    }
    EXPECT_EQ(decoded(encoded(all)), all);
}

} // namespace
