#pragma once

#include "program/view/live/livetable.h"

namespace velmora::cli {

// The first sensors with numbers, six at most, in digits that can be read from afar, each with a bar between the lowest
// and the highest value since the statistics began. Empty where the screen is too small to leave the table room.
std::string drawBig(std::vector<LiveRow> const& rows, FrameStyle const& style);

} // namespace velmora::cli
