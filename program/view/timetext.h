#pragma once

#include <chrono>
#include <cstdint>
#include <string>

namespace velmora::cli {

// A point in time as "2024-03-07T09:05:02.123Z".
std::string isoTime(std::chrono::system_clock::time_point time);
// The same of milliseconds since 1970.
std::string isoTimeOf(std::int64_t millis);

// The same in the local zone, in a form of strftime.
std::string localTime(std::chrono::system_clock::time_point time, char const* form);

} // namespace velmora::cli
