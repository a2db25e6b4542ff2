#pragma once

#include <string>
#include <vector>

namespace velmora::cli {

// How many lines big digits take: blocks are half as high as characters.
constexpr std::size_t bigLines(bool ascii)
{
    return ascii ? 5 : 3;
}

// Digits, sign, point and dash in lines of the same width, of block characters or of # alone; nothing for a text that
// holds anything else.
std::vector<std::string> bigText(std::string const& text, bool ascii);

// How wide they are.
std::size_t bigWidth(std::string const& text);

} // namespace velmora::cli
