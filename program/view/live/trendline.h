#pragma once

#include <cstddef>
#include <deque>
#include <string>

namespace velmora::cli {

// A line of block characters, or of ASCII, lowest to highest; right-aligned in the width. What is no number leaves a
// gap.
std::string trendLine(std::deque<double> const& numbers, std::size_t width, bool ascii = false);

} // namespace velmora::cli
