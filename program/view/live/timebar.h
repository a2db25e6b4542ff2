#pragma once

#include <cstdint>
#include <string>

namespace velmora::cli {

// Where a recording stands: "0:12 [===.......] 5:00". All in milliseconds.
std::string timeBar(std::int64_t position, std::int64_t begin, std::int64_t end, std::size_t width);

} // namespace velmora::cli
