#include "simulator/bytes.h"

#include <algorithm>

namespace obdsim {

namespace {

constexpr char digits[] = "0123456789ABCDEF";

std::uint8_t digitValue(char character)
{
    if (character >= '0' && character <= '9') {
        return static_cast<std::uint8_t>(character - '0');
    }
    char const lower = static_cast<char>(character | 0x20);
    return static_cast<std::uint8_t>(lower - 'a' + 10);
}

bool isBlank(char character)
{
    return character == ' ' || (character >= '\t' && character <= '\r');
}

} // namespace

bool isHexDigit(char character)
{
    return (character >= '0' && character <= '9') || (character >= 'A' && character <= 'F') ||
           (character >= 'a' && character <= 'f');
}

bool isHexText(std::string_view text)
{
    return !text.empty() && std::all_of(text.begin(), text.end(), isHexDigit);
}

std::string hexByte(std::uint8_t byte)
{
    return {digits[byte >> 4], digits[byte & 0x0F]};
}

std::string hexText(Bytes const& bytes, std::string_view separator)
{
    std::string text;
    for (auto const byte : bytes) {
        if (!text.empty()) {
            text += separator;
        }
        text += hexByte(byte);
    }
    return text;
}

std::string hexNumber(std::uint32_t number, std::size_t width)
{
    std::string text;
    while (number != 0 || text.size() < width) {
        text.insert(text.begin(), digits[number & 0x0F]);
        number >>= 4;
    }
    return text;
}

void appendWord(Bytes& bytes, std::uint16_t word)
{
    bytes.push_back(static_cast<std::uint8_t>(word >> 8));
    bytes.push_back(static_cast<std::uint8_t>(word & 0xFF));
}

std::optional<Bytes> parseHex(std::string_view text)
{
    std::string const packed = normaliseCommand(text);
    if (packed.size() % 2 != 0 || !std::all_of(packed.begin(), packed.end(), isHexDigit)) {
        return std::nullopt;
    }
    Bytes bytes;
    for (std::size_t i = 0; i < packed.size(); i += 2) {
        bytes.push_back(static_cast<std::uint8_t>(digitValue(packed[i]) << 4 | digitValue(packed[i + 1])));
    }
    return bytes;
}

std::optional<std::uint32_t> parseHexNumber(std::string_view text)
{
    if (text.size() > 8 || !isHexText(text)) {
        return std::nullopt;
    }
    std::uint32_t number = 0;
    for (char const character : text) {
        number = number << 4 | digitValue(character);
    }
    return number;
}

std::string normaliseCommand(std::string_view text)
{
    std::string result;
    for (char const character : text) {
        if (!isBlank(character)) {
            bool const lower = character >= 'a' && character <= 'z';
            result += lower ? static_cast<char>(character - 0x20) : character;
        }
    }
    return result;
}

} // namespace obdsim
