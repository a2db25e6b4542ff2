#include "simulator/bytes.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Bytes;

TEST(Bytes, areWrittenAsUpperCaseDigits)
{
    EXPECT_EQ(obdsim::hexText({0x41, 0x0C, 0x1A, 0xF8}), "410C1AF8");
    EXPECT_EQ(obdsim::hexText({0x41, 0x0C}, " "), "41 0C");
    EXPECT_EQ(obdsim::hexText({}), "");
    EXPECT_EQ(obdsim::hexNumber(0x7E8, 3), "7E8");
    EXPECT_EQ(obdsim::hexNumber(0x14, 3), "014");
    EXPECT_EQ(obdsim::hexNumber(0, 1), "0");
}

TEST(Bytes, areReadFromDigitsWithOrWithoutBlanks)
{
    EXPECT_EQ(obdsim::parseHex("41 0c 1A f8"), (Bytes{0x41, 0x0C, 0x1A, 0xF8}));
    EXPECT_EQ(obdsim::parseHex("410C"), (Bytes{0x41, 0x0C}));
    EXPECT_EQ(obdsim::parseHex(""), Bytes{});
    EXPECT_FALSE(obdsim::parseHex("410"));
    EXPECT_FALSE(obdsim::parseHex("4G"));
}

TEST(Bytes, aNumberHasUpToEightDigits)
{
    EXPECT_EQ(obdsim::parseHexNumber("18DAF110"), 0x18DAF110U);
    EXPECT_EQ(obdsim::parseHexNumber("0"), 0U);
    EXPECT_FALSE(obdsim::parseHexNumber(""));
    EXPECT_FALSE(obdsim::parseHexNumber("118DAF110"));
    EXPECT_FALSE(obdsim::parseHexNumber("7E 8"));
}

TEST(Bytes, commandsAreComparedInCapitalsWithoutBlanks)
{
    EXPECT_EQ(obdsim::normaliseCommand(" at sp\t6  "), "ATSP6");
    EXPECT_EQ(obdsim::normaliseCommand("\r\n"), "");
}

} // namespace
