#pragma once

#include <algorithm>
#include <string_view>
#include <vector>

namespace obd {

// What frames the adapter's text and is no part of it: NULs (which adapters emit at a change of the line rate), line
// ends, the prompt.
inline constexpr std::string_view lineFraming{"\0\n\r>", 4};

// Removes every byte that stands in unwanted.
inline void removeBytes(std::vector<unsigned char>& bytes, std::string_view unwanted)
{
    std::erase_if(bytes, [unwanted](unsigned char byte) {
        return unwanted.find(static_cast<char>(byte)) != std::string_view::npos;
    });
}

} // namespace obd
