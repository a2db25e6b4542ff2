#pragma once

#include <string>

namespace velmora::cli {

// Prints a report; on a terminal that is narrower, its lines are folded between words.
void printText(std::string const& text);

} // namespace velmora::cli
