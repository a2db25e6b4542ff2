#pragma once

#include <string>

namespace velmora::cli {

// Prints a report; on a terminal that is narrower, its lines are folded between words.
void printText(std::string const& text);

// The same on standard error, for what is told beside the values.
void tellText(std::string const& text);

} // namespace velmora::cli
