#include "libobd/bytes/hexformat.h"

#include <algorithm>

namespace obd {
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
