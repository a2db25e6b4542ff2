#pragma once

#include "libvelmora/read/sensorchoice.h"
#include "program/view/livetable.h"

#include <deque>
#include <set>
#include <string>
#include <vector>

namespace velmora::cli {

// The size of a frame, and how it may look.
struct FrameStyle
{
    std::size_t columns = 80;
    std::size_t rows = 24;
    bool bold = false;  // whether the heading may stand out
    bool ascii = false; // whether nothing but ASCII may be drawn
};

// A line of block characters, or of ASCII, lowest to highest; right-aligned in the width.
std::string trendLine(std::deque<double> const& numbers, std::size_t width, bool ascii = false);

// The table of live values: title, heading, the rows from first on as far as they fit, and status at the bottom, if
// there is any.
std::string drawTable(std::vector<LiveRow> const& rows, std::size_t first, std::string const& title,
                      std::string const& status, FrameStyle const& style);

// How many rows of values a frame has room for.
std::size_t roomForRows(FrameStyle const& style);

// The list in which a user marks the sensors to be shown.
class SensorPicker
{
public:
    SensorPicker(std::vector<OfferedSensor> offered, SensorIds const& chosen);

    void move(int lines); // down, or up below 0
    void toggle();
    // Those marked: first the ones of before in their order, then the others in that of the list.
    SensorIds chosen() const;

    std::string draw(FrameStyle const& style) const;

private:
    std::vector<OfferedSensor> m_offered;
    SensorIds m_before;
    std::set<obd::ParameterIdentifier::Id> m_marked;
    std::size_t m_cursor = 0;
};

} // namespace velmora::cli
