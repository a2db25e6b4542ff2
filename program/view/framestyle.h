#pragma once

#include <chrono>
#include <cstddef>
#include <string>

namespace velmora::cli {

using LiveTime = std::chrono::steady_clock::time_point;

// The size of a frame, how it may look, and when it is seen.
struct FrameStyle
{
    std::size_t columns = 80;
    std::size_t rows = 24;
    bool bold = false;     // whether text may stand out, or be dim
    bool ascii = false;    // whether nothing but ASCII may be drawn
    bool coloured = false; // whether text may have colours
    LiveTime now{};        // what ages are told by
};

// What a text of a frame tells by its look. It is never told by that alone.
enum class Look
{
    Plain,
    Heading,
    Stale,   // is not of now
    Outside, // a value beyond its limit
    Marked,  // under the cursor
};

// The text between the sequences that switch its look on and off, as far as the style allows it.
std::string looking(Look look, std::string const& text, FrameStyle const& style);

// The text, or as much of it as so many columns hold.
std::string cutTo(std::string const& text, std::size_t columns);

// "12 s ago", "3 min ago".
std::string ageText(LiveTime::duration age);

// The same text for a terminal that shows ASCII alone; each character stays as wide as it was.
std::string toAscii(std::string const& text);

} // namespace velmora::cli
