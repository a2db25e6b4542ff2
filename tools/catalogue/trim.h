#pragma once

#include <cstddef>
#include <string_view>

namespace catalogue {

// The text without the blanks at its ends.
inline std::string_view trim(std::string_view text)
{
    std::size_t const first = text.find_first_not_of(' ');
    if (first == std::string_view::npos) {
        return {};
    }
    return text.substr(first, text.find_last_not_of(' ') - first + 1);
}

} // namespace catalogue
