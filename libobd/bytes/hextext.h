#pragma once

#include <array>
#include <cstddef>
#include <span>
#include <vector>

namespace obd {

// By character; noHexDigit for what is none, upper or lower case.
inline constexpr unsigned char noHexDigit = 0xFF;

inline constexpr std::array<unsigned char, 256> hexDigitValues = [] {
    std::array<unsigned char, 256> values{};
    values.fill(noHexDigit);
    for (unsigned char i = 0; i < 10; ++i) {
        values[static_cast<std::size_t>('0' + i)] = i;
    }
    for (unsigned char i = 0; i < 6; ++i) {
        values[static_cast<std::size_t>('A' + i)] = static_cast<unsigned char>(10 + i);
        values[static_cast<std::size_t>('a' + i)] = static_cast<unsigned char>(10 + i);
    }
    return values;
}();

// The byte of two characters: 0x00 if the first is no digit, and the first digit's value if only the second is none.
inline unsigned char hexPairValue(unsigned char first, unsigned char second)
{
    unsigned char const high = hexDigitValues[first];
    unsigned char const low = hexDigitValues[second];
    if (high == noHexDigit) {
        return 0;
    }
    return low == noHexDigit ? high : static_cast<unsigned char>(high << 4 | low);
}

// Appends the bytes of a hexadecimal text, two characters each, upper or lower case. Never fails: a single character at
// the end is ignored, and pairs that are no number are read as hexPairValue tells.
void hexTextToBytes(std::vector<unsigned char> const& text, std::vector<unsigned char>& bytes);

// The same into memory at hand: decodes as many whole pairs as bytes has room for and returns their count.
std::size_t hexTextToBytes(std::span<unsigned char const> text, std::span<unsigned char> bytes);

// Appends each byte as two upper-case digits, without separators.
void bytesToHexText(std::vector<unsigned char> const& bytes, std::vector<unsigned char>& text);

} // namespace obd
