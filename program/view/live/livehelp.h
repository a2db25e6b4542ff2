#pragma once

#include "program/view/framestyle.h"

#include <string>
#include <utility>
#include <vector>

namespace velmora::cli {

// The keys of the live view, its own and those given, each with what it does.
std::string drawHelp(std::vector<std::pair<std::string, std::string>> const& further, FrameStyle const& style);

} // namespace velmora::cli
