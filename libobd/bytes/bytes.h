#pragma once

#include <algorithm>
#include <array>
#include <cstddef>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace obd {

// A stretch of bytes owned by someone else.
using ByteView = std::span<unsigned char const>;

// Bytes index..index+count of the view. Throws std::out_of_range if they are not all there.
inline ByteView slice(ByteView bytes, std::size_t index, std::size_t count)
{
    if (index > bytes.size() || count > bytes.size() - index) {
        throw std::out_of_range("bytes outside the message");
    }
    return bytes.subspan(index, count);
}

// The byte at index. Throws std::out_of_range if there is none.
inline unsigned char byteAt(ByteView bytes, std::size_t index)
{
    return slice(bytes, index, 1).front();
}

inline std::vector<unsigned char> toVector(ByteView bytes)
{
    return {bytes.begin(), bytes.end()};
}

// Overwrites target from index on. Throws std::out_of_range, leaving target alone, if source does not fit in.
inline void copyInto(std::vector<unsigned char>& target, std::size_t index, ByteView source)
{
    if (index > target.size() || source.size() > target.size() - index) {
        throw std::out_of_range("copy past the end of the message");
    }
    std::copy(source.begin(), source.end(), target.begin() + static_cast<std::ptrdiff_t>(index));
}

// Big-endian fields of vehicle data. They throw std::out_of_range where a byte is missing: callers test the length
// first.
inline unsigned int readUint16(ByteView data, std::size_t offset)
{
    return static_cast<unsigned int>(byteAt(data, offset)) << 8U | byteAt(data, offset + 1);
}

inline unsigned int readUint32(ByteView data, std::size_t offset)
{
    return readUint16(data, offset) << 16U | readUint16(data, offset + 2);
}

// Whether the bytes of prefix stand in data at the position.
inline bool startsWith(ByteView data, ByteView prefix, std::size_t position)
{
    return data.size() >= position + prefix.size() &&
           std::equal(prefix.begin(), prefix.end(), data.begin() + static_cast<std::ptrdiff_t>(position));
}

// What frames the adapter's text and is no part of it: NULs (which adapters emit at a change of the line rate), line
// ends, the prompt.
inline constexpr std::string_view lineFraming{"\0\n\r>", 4};

// Removes every byte that stands in unwanted.
inline void removeBytes(std::vector<unsigned char>& bytes, std::string_view unwanted)
{
    std::erase_if(bytes, [unwanted](unsigned char byte) {
        return unwanted.find(static_cast<char>(byte)) != std::string_view::npos;
    });
}

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

// Upper-case hexadecimal with at least `width` digits, as requests and names are written.
std::string upperHex(unsigned int value, unsigned int width = 1);

// Lower-case hexadecimal without leading zeros, as log lines are written.
std::string lowerHex(unsigned int value);

// " 0x" and the byte in log form for each byte: " 0x41 0xc".
std::string hexDump(std::vector<unsigned char> const& bytes);

} // namespace obd
