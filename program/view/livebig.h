#pragma once

#include "program/view/livescreen.h"

namespace velmora::cli {

// The first sensors with numbers, six at most, in digits that can be read from afar, each with a bar between the lowest
// and the highest value since the statistics began. Empty where the screen is too small to leave the table room.
std::string drawBig(std::vector<LiveRow> const& rows, FrameStyle const& style);

// The same text for a terminal that shows ASCII alone; each character stays as wide as it was.
std::string toAscii(std::string const& text);

} // namespace velmora::cli
