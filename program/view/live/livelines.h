#pragma once

#include "program/view/live/livetable.h"

#include <string>

namespace velmora::cli {

// A point in time as "2024-03-07T09:05:02.123Z".
std::string isoTime(std::chrono::system_clock::time_point time);

// "Engine RPM: 1726 rpm\n"
std::string toLine(LiveRow const& row);

// One line of JSON with its line feed. An empty time is null.
std::string toJsonLine(LiveRow const& row, std::string const& time);

} // namespace velmora::cli
