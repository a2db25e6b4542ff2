#pragma once

#include "program/view/framestyle.h"

#include <velmora/live.h>

#include <string>
#include <vector>

namespace velmora::cli {

// The list in which a user marks the sensors to be shown, and puts them in order. Those that are shown stand first.
class SensorPicker
{
public:
    SensorPicker(std::vector<LiveOffer> offered, std::vector<int> const& chosen);

    void move(int lines); // the cursor: down, or up below 0
    void toggle();
    // Moves the sensor under the cursor among the others.
    void carry(int lines);
    // Those marked, in the order of the list.
    std::vector<int> chosen() const;

    std::string draw(FrameStyle const& style) const;

private:
    struct Line
    {
        LiveOffer sensor;
        bool marked = false;
    };

    std::size_t at(int lines) const;

    std::vector<Line> m_lines;
    std::size_t m_cursor = 0;
};

} // namespace velmora::cli
