#include "program/globaloptions.h"

#include <gtest/gtest.h>

namespace {

using velmora::cli::parseEcuId;
using velmora::cli::parseProtocol;

TEST(GlobalOptions, ProtocolsAreNumbersAsAdaptersPrintThem)
{
    EXPECT_EQ(parseProtocol("auto"), 0);
    EXPECT_EQ(parseProtocol("1"), 1);
    EXPECT_EQ(parseProtocol("6"), 6);
    EXPECT_EQ(parseProtocol("9"), 9);
    EXPECT_EQ(parseProtocol("A6"), 6);
    EXPECT_EQ(parseProtocol("a3"), 3);
    for (char const* text : {"", "0", "10", "A", "AA", "B6", "A66", "Auto", "six", " 6"}) {
        EXPECT_EQ(parseProtocol(text), std::nullopt) << text;
    }
}

TEST(GlobalOptions, ControlModulesAreHexadecimalNumbersOf29Bits)
{
    EXPECT_EQ(parseEcuId("7E8"), 0x7E8U);
    EXPECT_EQ(parseEcuId("0x7e9"), 0x7E9U);
    EXPECT_EQ(parseEcuId("18DAF110"), 0x18DAF110U);
    EXPECT_EQ(parseEcuId("1FFFFFFF"), 0x1FFFFFFFU);
    for (char const* text : {"", "0x", "20000000", "7EX", "-1", "123456789"}) {
        EXPECT_EQ(parseEcuId(text), std::nullopt) << text;
    }
}

} // namespace
