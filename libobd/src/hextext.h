#pragma once

#include <cstddef>
#include <span>
#include <vector>

namespace obd {

// Appends the bytes of a hexadecimal text, two characters each, upper or lower case. Never fails: a single character at
// the end is ignored, a pair that does not begin with a digit is 0x00, and a pair with a digit in its first place only
// is that digit's value.
void hexTextToBytes(std::vector<unsigned char> const& text, std::vector<unsigned char>& bytes);

// The same into memory at hand: decodes as many whole pairs as bytes has room for and returns their count.
std::size_t hexTextToBytes(std::span<unsigned char const> text, std::span<unsigned char> bytes);

// Appends each byte as two upper-case digits, without separators.
void bytesToHexText(std::vector<unsigned char> const& bytes, std::vector<unsigned char>& text);

} // namespace obd
