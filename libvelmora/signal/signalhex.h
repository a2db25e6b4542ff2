#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace velmora {

// "220101" of the bytes.
std::string hexText(std::vector<unsigned char> const& bytes);

// The bytes of hexadecimal text, blanks between them allowed. Nothing for any other text or half a byte.
std::optional<std::vector<unsigned char>> hexBytes(std::string_view text);

// Capitals without blanks, where the text is hexadecimal; else nothing.
std::optional<std::string> hexDigits(std::string_view text);

} // namespace velmora
