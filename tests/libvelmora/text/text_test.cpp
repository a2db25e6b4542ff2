#include "libvelmora/text/text.h"

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

} // namespace
