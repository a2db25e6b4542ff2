#include "simulator/bus/checksum.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Bytes;

struct Case
{
    char const* message;
    std::uint8_t check;
};

// Frames of real cars and bench simulators; the last byte of each is `check`.
Case const sumCases[] = {
    {"86 F1 12 41 00 98 3B 20 13", 0xD0},    // KWP, a delivery van of 2005
    {"83 F1 12 41 0D 00", 0xD4},             // the same, speed
    {"87 F1 18 43 00 00 00 00 00 00", 0xD3}, // KWP, no codes
    {"87 F1 12 43 15 53 13 28 00 00", 0x70}, // KWP, two codes
    {"83 F1 10 7F 01 11", 0x15},             // KWP, a refusal
    {"48 6B 13 41 00 BE 1F B8 11", 0xAD},    // ISO 9141-2, Volvo V40
    {"48 6B 11 41 00 BE 1F B8 10", 0xAA},    // ISO 9141-2, Audi TT
    {"48 6B 10 43 04 20 00 00 00 00", 0x2A}, // ISO 9141-2, VW Jetta
    {"48 6B 10 43 03 00 03 02 03 03", 0x14}, // ISO 9141-2, misfires
};

Case const crcCases[] = {
    {"48 6B 10 43 03 06 03 56 00 00", 0xDC}, // VPW, Dodge Dakota
    {"48 6B 10 43 01 00 02 00 03 00", 0x05}, // VPW, bench
    {"48 6B 18 43 01 01 00 00 00 00", 0x5E}, // VPW, bench
    {"6C F1 10 62 11 72 01 36", 0xEA},       // VPW, physical addressing
    {"41 6B 10 43 01 00 02 00 03 00", 0x43}, // PWM, bench
    {"41 6B 10 41 00 BF 9F B9 90", 0x05},    // PWM, a Ford
    {"41 6B 10 41 19 05 FF", 0xE8},          // PWM, the right byte of a frame that came damaged
    {"48 6B 10 49 02 01 00 00 00 57", 0xB3}, // VPW, bench
};

TEST(Checksum, isTheSumOnIso9141AndKwp)
{
    for (auto const& row : sumCases) {
        EXPECT_EQ(obdsim::sumChecksum(*obdsim::parseHex(row.message)), row.check) << row.message;
    }
}

TEST(Checksum, isTheCrcOnJ1850)
{
    for (auto const& row : crcCases) {
        EXPECT_EQ(obdsim::j1850Crc(*obdsim::parseHex(row.message)), row.check) << row.message;
    }
}

} // namespace
