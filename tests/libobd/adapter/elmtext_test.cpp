#include "libobd/adapter/elmtext.h"

#include <gtest/gtest.h>

namespace {

std::string cropped(std::string_view word, std::string text)
{
    obd::cropWord(word, text);
    return text;
}

std::string croppedBefore(std::string_view word, std::string text)
{
    obd::cropBefore(word, text);
    return text;
}

std::string trimmed(std::string_view command, std::string text)
{
    obd::trim(command, text);
    return text;
}

TEST(ElmText, CropWordRemovesTheFirstOccurrenceOnly)
{
    EXPECT_EQ(cropped("OK", "OKOK"), "OK");
    EXPECT_EQ(cropped("ATZ", "xxATZyy"), "xxyy");
    EXPECT_EQ(cropped("ATZ", "ATZ"), "");
}

TEST(ElmText, CropWordLeavesATextWithoutTheWord)
{
    EXPECT_EQ(cropped("OK", "ok"), "ok");
    EXPECT_EQ(cropped("OK", ""), "");
    EXPECT_EQ(cropped("", "text"), "text");
}

TEST(ElmText, CropBeforeKeepsTheWord)
{
    EXPECT_EQ(croppedBefore("ATZ", "xxATZyy"), "ATZyy");
    EXPECT_EQ(croppedBefore("ATZ", "xATZyATZ"), "ATZyATZ");
    EXPECT_EQ(croppedBefore("ATZ", "ATZ"), "ATZ");
}

TEST(ElmText, CropBeforeLeavesATextWithoutTheWord)
{
    EXPECT_EQ(croppedBefore("ATZ", "xxatzyy"), "xxatzyy");
    EXPECT_EQ(croppedBefore("ATZ", ""), "");
}

TEST(ElmText, ResponseIsAPlainSubstring)
{
    EXPECT_TRUE(obd::hasResponse("ATE0OK", "OK"));
    EXPECT_TRUE(obd::hasResponse("NOK", "OK"));
    EXPECT_FALSE(obd::hasResponse("Ok", "OK"));
    EXPECT_FALSE(obd::hasResponse("", "OK"));
    EXPECT_TRUE(obd::hasResponse("", ""));
}

TEST(ElmText, TrimMakesAReplyComparable)
{
    EXPECT_EQ(trimmed("ATE0", "ate0 ok"), "OK");
    EXPECT_EQ(trimmed("ATSP6", "AT SP 6 OK "), "OK");
    EXPECT_EQ(trimmed("ATDPN", "A6"), "A6");
    EXPECT_EQ(trimmed("ATI", "??"), "?") << "one question mark goes";
    EXPECT_EQ(trimmed("", " o k "), "OK");
}

TEST(ElmText, UpperCaseIsForAsciiLettersOnly)
{
    EXPECT_EQ(obd::toUpper("az AZ 09 \xE4{`"), "AZ AZ 09 \xE4{`");
}

TEST(ElmText, StrippedLosesWhiteSpaceAtBothEnds)
{
    EXPECT_EQ(obd::stripped(" \t\r\n\v\fOBDII to RS232 Interpreter "), "OBDII to RS232 Interpreter");
    EXPECT_EQ(obd::stripped("a b"), "a b");
    EXPECT_EQ(obd::stripped(" "), "");
    EXPECT_EQ(obd::stripped(""), "");
}

} // namespace
