#include "libobd/parameters/bytetext.h"

#include "libobd/bytes/hexformat.h"

#include <algorithm>

namespace obd {

std::string trimmedText(std::vector<unsigned char> const& bytes)
{
    auto const isFilled = [](unsigned char byte) { return byte != 0; };
    auto const first = std::find_if(bytes.begin(), bytes.end(), isFilled);
    auto const last = std::find_if(bytes.rbegin(), bytes.rend(), isFilled).base();
    return first < last ? std::string(first, last) : std::string();
}

std::string compactText(std::vector<unsigned char> const& bytes)
{
    std::string text(bytes.begin(), bytes.end());
    text.erase(std::remove(text.begin(), text.end(), '\0'), text.end());
    return text;
}

std::string hexText(std::vector<unsigned char> const& bytes)
{
    std::string text;
    for (unsigned char const byte : bytes) {
        text += upperHex(byte, 2);
    }
    return text;
}

std::vector<unsigned char> slice(std::vector<unsigned char> const& bytes, std::size_t offset, std::size_t count)
{
    auto const first = bytes.begin() + static_cast<std::ptrdiff_t>(offset);
    return {first, first + static_cast<std::ptrdiff_t>(count)};
}

} // namespace obd
