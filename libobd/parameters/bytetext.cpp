#include "libobd/parameters/bytetext.h"

#include <algorithm>

namespace obd {

std::string trimmedText(ByteView bytes)
{
    auto const isFilled = [](unsigned char byte) { return byte != 0; };
    auto const first = std::find_if(bytes.begin(), bytes.end(), isFilled);
    auto const last = std::find_if(bytes.rbegin(), bytes.rend(), isFilled).base();
    return first < last ? std::string(first, last) : std::string();
}

std::string compactText(ByteView bytes)
{
    std::string text(bytes.begin(), bytes.end());
    text.erase(std::remove(text.begin(), text.end(), '\0'), text.end());
    return text;
}

std::string hexText(ByteView bytes)
{
    std::string text;
    for (unsigned char const byte : bytes) {
        text += upperHex(byte, 2);
    }
    return text;
}

} // namespace obd
