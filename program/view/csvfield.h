#pragma once

#include <string>

namespace velmora::cli {

// Quoted when a CSV reader needs it.
std::string csvField(std::string const& text);

} // namespace velmora::cli
