#include "libobd/bytes/bytes.h"

#include <algorithm>
#include <array>

namespace obd {

namespace {

constexpr std::array<unsigned char, 16> upperDigits = {'0', '1', '2', '3', '4', '5', '6', '7',
                                                       '8', '9', 'A', 'B', 'C', 'D', 'E', 'F'};

} // namespace

void hexTextToBytes(std::vector<unsigned char> const& text, std::vector<unsigned char>& bytes)
{
    std::size_t const before = bytes.size();
    bytes.resize(before + text.size() / 2);
    hexTextToBytes(std::span(text), std::span(bytes).subspan(before));
}

std::size_t hexTextToBytes(std::span<unsigned char const> text, std::span<unsigned char> bytes)
{
    std::size_t const count = std::min(text.size() / 2, bytes.size());
    for (std::size_t i = 0; i < count; ++i) {
        bytes[i] = hexPairValue(text[2 * i], text[2 * i + 1]);
    }
    return count;
}

void bytesToHexText(std::vector<unsigned char> const& bytes, std::vector<unsigned char>& text)
{
    text.reserve(text.size() + 2 * bytes.size());
    for (unsigned char const byte : bytes) {
        text.push_back(upperDigits[byte >> 4]);
        text.push_back(upperDigits[byte & 0x0F]);
    }
}

namespace {

std::string hex(unsigned int value, unsigned int width, char const* digits)
{
    std::string text;
    for (; value != 0 || text.size() < std::max(width, 1U); value >>= 4U) {
        text.insert(text.begin(), digits[value & 0xFU]);
    }
    return text;
}

} // namespace

std::string upperHex(unsigned int value, unsigned int width)
{
    return hex(value, width, "0123456789ABCDEF");
}

std::string lowerHex(unsigned int value)
{
    return hex(value, 1, "0123456789abcdef");
}

std::string hexDump(std::vector<unsigned char> const& bytes)
{
    std::string text;
    for (unsigned char const byte : bytes) {
        text += " 0x" + lowerHex(byte);
    }
    return text;
}

} // namespace obd
