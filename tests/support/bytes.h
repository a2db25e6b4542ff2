#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace support {

inline std::vector<unsigned char> bytes(std::string_view characters)
{
    return {characters.begin(), characters.end()};
}

inline std::string text(std::vector<unsigned char> const& data)
{
    return {data.begin(), data.end()};
}

} // namespace support
