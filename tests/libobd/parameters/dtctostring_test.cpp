#include "libobd/parameters/dtcparameter.h"

#include <gtest/gtest.h>

#include <stdexcept>

namespace {

using obd::dtcToString;

TEST(DtcToString, TheHighNibbleGivesLetterAndFirstDigit)
{
    static constexpr char const* prefixes[] = {"P0", "P1", "P2", "P3", "C0", "C1", "C2", "C3",
                                               "B0", "B1", "B2", "B3", "U0", "U1", "U2", "U3"};
    for (unsigned int nibble = 0; nibble < 16; ++nibble) {
        EXPECT_EQ(dtcToString({static_cast<unsigned char>(nibble << 4U | 1U), 0x33}),
                  std::string(prefixes[nibble]) + "133");
    }
}

TEST(DtcToString, DigitsAreUpperCaseAndZeroFilled)
{
    EXPECT_EQ(dtcToString({0x01, 0x33}), "P0133");
    EXPECT_EQ(dtcToString({0xD1, 0x0A}), "U110A");
    EXPECT_EQ(dtcToString({0x0A, 0x0F}), "P0A0F");
    EXPECT_EQ(dtcToString({0x00, 0x01}), "P0001");
    EXPECT_EQ(dtcToString({0xFF, 0xFF}), "U3FFF");
}

TEST(DtcToString, ZeroInTheLowerTwelveBitsIsNoCode)
{
    for (unsigned int nibble = 0; nibble < 16; ++nibble) {
        EXPECT_EQ(dtcToString({static_cast<unsigned char>(nibble << 4U), 0x00}), "");
    }
    EXPECT_EQ(dtcToString({0x10, 0x01}), "P1001");
    EXPECT_EQ(dtcToString({0x11, 0x00}), "P1100");
}

TEST(DtcToString, MoreBytesAreNotLookedAt)
{
    EXPECT_EQ(dtcToString({0x04, 0x20, 0xC1, 0x00}), "P0420");
}

TEST(DtcToString, LessThanTwoBytesThrow)
{
    EXPECT_THROW(dtcToString({}), std::out_of_range);
    EXPECT_THROW(dtcToString({0x01}), std::out_of_range);
}

} // namespace
