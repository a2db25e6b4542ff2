#pragma once

#include "program/view/live/livetable.h"

#include <string>

namespace velmora::cli {

// "Engine RPM: 1726 rpm\n"
std::string toLine(LiveRow const& row);

// One line of JSON with its line feed. An empty time is null.
std::string toJsonLine(LiveRow const& row, std::string const& time);

} // namespace velmora::cli
