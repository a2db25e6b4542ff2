#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace obdsim {

/// Bytes on a vehicle bus.
using Bytes = std::vector<std::uint8_t>;

/// True for the digits 0-9, A-F and a-f.
bool isHexDigit(char character);

/// True if `text` is not empty and holds hexadecimal digits only.
bool isHexText(std::string_view text);

/// Two upper-case digits.
std::string hexByte(std::uint8_t byte);

/// Each byte as two upper-case digits, with `separator` between them.
std::string hexText(Bytes const& bytes, std::string_view separator = "");

/// `number` in upper-case hexadecimal, zero-filled to `digits`.
std::string hexNumber(std::uint32_t number, std::size_t digits);

/// Appends `word`, its high byte first.
void appendWord(Bytes& bytes, std::uint16_t word);

/// Bytes of a text such as "41 0C 1A F8" or "410C1AF8"; nothing if a character
/// is neither digit nor blank, or if the count of digits is odd.
std::optional<Bytes> parseHex(std::string_view text);

/// A number of 1 to 8 hexadecimal digits; nothing for any other text.
std::optional<std::uint32_t> parseHexNumber(std::string_view text);

/// `text` in upper case and without white space: the form in which adapters
/// compare commands.
std::string normaliseCommand(std::string_view text);

} // namespace obdsim
