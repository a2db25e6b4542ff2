#pragma once

#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace support {

// "41 0C 1A F8" as bytes. Blanks are free; anything else that is no hexadecimal pair is a mistake in the test.
inline std::vector<unsigned char> hexBytes(std::string_view text)
{
    std::string digits;
    for (char const c : text) {
        if (c != ' ') {
            digits += c;
        }
    }
    if (digits.size() % 2 != 0 || digits.find_first_not_of("0123456789abcdefABCDEF") != std::string::npos) {
        throw std::invalid_argument("not hexadecimal pairs: " + digits);
    }
    std::vector<unsigned char> result;
    for (std::size_t i = 0; i < digits.size(); i += 2) {
        result.push_back(static_cast<unsigned char>(std::stoi(digits.substr(i, 2), nullptr, 16)));
    }
    return result;
}

// The characters of a reply without the blanks that a test puts in for the reader.
inline std::vector<unsigned char> replyText(std::string_view text)
{
    std::vector<unsigned char> result;
    for (char const c : text) {
        if (c != ' ') {
            result.push_back(static_cast<unsigned char>(c));
        }
    }
    return result;
}

} // namespace support
