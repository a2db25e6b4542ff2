#pragma once

#include "program/view/framestyle.h"
#include "program/view/live/livetable.h"

#include <string>
#include <vector>

namespace velmora::cli {

// The table of live values: title, heading, the rows from first on as far as they fit, and status at the bottom, if
// there is any. A value that is gone stays, dim and with its age, where there is room to tell that.
std::string drawTable(std::vector<LiveRow> const& rows, std::size_t first, std::string const& title,
                      std::string const& status, FrameStyle const& style);

// How many rows of values a frame has room for.
std::size_t roomForRows(FrameStyle const& style);

} // namespace velmora::cli
