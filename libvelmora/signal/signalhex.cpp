#include "libvelmora/signal/signalhex.h"

#include <cctype>

namespace velmora {

namespace {

unsigned int digitValue(char digit)
{
    return static_cast<unsigned int>(digit <= '9' ? digit - '0' : digit - 'A' + 10);
}

} // namespace

std::string hexText(std::vector<unsigned char> const& bytes)
{
    constexpr std::string_view digits = "0123456789ABCDEF";
    std::string text;
    for (unsigned char const byte : bytes) {
        text += digits[byte >> 4U];
        text += digits[byte & 0xFU];
    }
    return text;
}

std::optional<std::string> hexDigits(std::string_view text)
{
    std::string digits;
    for (char const each : text) {
        if (each == ' ') {
            continue;
        }
        if (std::isxdigit(static_cast<unsigned char>(each)) == 0) {
            return std::nullopt;
        }
        digits += static_cast<char>(std::toupper(static_cast<unsigned char>(each)));
    }
    return digits;
}

std::optional<std::vector<unsigned char>> hexBytes(std::string_view text)
{
    auto const digits = hexDigits(text);
    if (!digits || digits->size() % 2 != 0) {
        return std::nullopt;
    }
    std::vector<unsigned char> bytes;
    for (std::size_t i = 0; i < digits->size(); i += 2) {
        bytes.push_back(static_cast<unsigned char>(digitValue((*digits)[i]) << 4U | digitValue((*digits)[i + 1])));
    }
    return bytes;
}

} // namespace velmora
