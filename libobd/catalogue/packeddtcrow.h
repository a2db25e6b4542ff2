#pragma once

#include <cstddef>
#include <cstdint>

namespace obd {

// A row as the generated table stores it: 12 bytes without a pointer, so that the table needs no relocation when the
// library is loaded and its pages stay shared between processes.
struct PackedDtcRow
{
    char code[7]; // ends in a zero; six characters for the malformed codes
    std::uint8_t maker;
    std::uint16_t textBlock;
    std::uint16_t textOffset; // inside its block
};

extern const PackedDtcRow packedDtcRows[];
extern const std::size_t packedDtcRowCount;

// The texts, each stored once and ended by a zero, in blocks that a 16 bit offset reaches.
extern char const* const dtcTextBlocks[];

} // namespace obd
