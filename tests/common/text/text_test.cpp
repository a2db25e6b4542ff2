#include "common/text/text.h"

#include <gtest/gtest.h>

namespace {

using velmora::readable;

TEST(Text, ReadableKeepsWhatPeopleCanRead)
{
    EXPECT_EQ(readable(""), "");
    EXPECT_EQ(readable("ELM327 v1.5"), "ELM327 v1.5");
    EXPECT_EQ(readable("\u00B0C \u20AC \U0001F697"), "\u00B0C \u20AC \U0001F697");
}

TEST(Text, ReadableShowsNoiseAsReplacementCharacters)
{
    EXPECT_EQ(readable("\xFC"
                       "ELM"),
              "\uFFFD"
              "ELM");
    EXPECT_EQ(readable("a\r\n\x1B[2J"), "a\uFFFD\uFFFD\uFFFD[2J");
    EXPECT_EQ(readable("\xE2\x82"), "\uFFFD\uFFFD") << "a character cut off";
    EXPECT_EQ(readable("\xE2(\x82\xF5\x80\x80\x80"), "\uFFFD(\uFFFD\uFFFD\uFFFD\uFFFD\uFFFD") << "no characters";
    EXPECT_EQ(readable("\xC0\x80"), "\uFFFD\uFFFD") << "no shortest form";
    EXPECT_EQ(readable(std::string("a\0b", 3)), "a\uFFFD"
                                                "b");
}

TEST(Text, AnAdaptersReplyIsOneLine)
{
    EXPECT_EQ(velmora::printableLine("\r\nELM327  v1.5\r\r"), "ELM327 v1.5");
    EXPECT_EQ(velmora::printableLine(std::string_view("A\0B\x7F\xFC", 5)), "A B");
    EXPECT_EQ(velmora::printableLine(" \t"), "");
}

TEST(Text, ACellOfATableIsQuotedWhereItHasTo)
{
    using velmora::csvField;
    EXPECT_EQ(csvField("a b;c"), "a b;c");
    EXPECT_EQ(csvField("a,\"b\""), "\"a,\"\"b\"\"\"");
    EXPECT_EQ(csvField("a\nb"), "\"a\nb\"");
    EXPECT_EQ(csvField("a\rb"), "\"a\rb\"");
}

TEST(Text, ANumberIsTheWholeText)
{
    EXPECT_EQ(velmora::numberIn("-12.5"), -12.5);
    EXPECT_EQ(velmora::numberIn("0"), 0.0);
    for (std::string const text : {"", "-", "12 km", " 12", "+12", "0x10", "inf", "nan", "1e999"}) {
        EXPECT_EQ(velmora::numberIn(text), std::nullopt) << text;
    }
}

TEST(Text, WidthsAreThoseOfATerminal)
{
    using velmora::displayWidth;
    EXPECT_EQ(displayWidth("abc"), 3U);
    EXPECT_EQ(displayWidth("21 \u00B0C \u2588"), 7U);
    EXPECT_EQ(displayWidth("\u65E5\u672C"), 4U) << "wide characters";
    EXPECT_EQ(displayWidth("e\u0301"), 1U) << "an accent joins its letter";
    EXPECT_EQ(displayWidth("a\xFF\xE2\x82"), 4U) << "bytes that are no characters";
    EXPECT_EQ(velmora::bytesOfWidth("\u65E5\u672C", 3), 3U);
    EXPECT_EQ(velmora::bytesOfWidth("e\u0301x", 1), 3U);
}

TEST(Text, FittedFillsTheWidthExactly)
{
    using velmora::fitted;
    EXPECT_EQ(fitted("ab", 4), "ab  ");
    EXPECT_EQ(fitted("ab", 4, true), "  ab");
    EXPECT_EQ(fitted("abcdef", 4), "abc\u2026");
    EXPECT_EQ(fitted("\u65E5\u672C\u65E5", 4), "\u65E5\u2026 ") << "half of a wide character can't be shown";
    EXPECT_EQ(fitted("ab", 0), "");
}

} // namespace
