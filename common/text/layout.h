#pragma once

#include "common/text/style.h"

#include <string>
#include <vector>

namespace velmora {

// One line under the heading of a control module: label and value in columns. A value that was not told is "-".
std::string labelledLine(std::string const& label, std::string const& value);

struct Cell
{
    std::string text;
    Mark mark = Mark::None;
    bool rightAligned = false;
};

// A line a row behind the indent, each column as wide as its widest cell. A row of one cell stands across all columns.
// Where the style's columns are too few, the widest cells take several lines, as far as no word is broken.
std::string drawColumns(std::vector<std::vector<Cell>> const& rows, std::string const& indent, Style const& style);

// The text in lines of at most that many characters, and of no more than the style's columns, where words allow it,
// each behind the indent.
std::string wrapped(std::string const& text, std::size_t width, std::string const& indent, Style const& style = {});

// The text with each line that is wider folded between words; what follows hangs below the line's last column, if that
// leaves room. 0 columns fold nothing. Sequences that switch colours have no width.
std::string folded(std::string const& text, std::size_t columns);

// "1 code", "2 codes", "0 codes".
std::string counted(std::size_t count, std::string const& noun);

} // namespace velmora
