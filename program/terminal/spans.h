#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace velmora::cli {

// How a part of a line looks.
struct SpanLook
{
    bool bold = false;
    bool dim = false;
    bool reverse = false;
    int color = -1; // 0 to 7 in the order of ANSI; -1: the terminal's own

    bool operator==(SpanLook const&) const = default;
};

struct Span
{
    std::string text;
    SpanLook look;

    bool operator==(Span const&) const = default;
};

// The parts of a line between the sequences that switch its look (SGR), which other sequences are dropped with.
std::vector<Span> spansOf(std::string_view line);

} // namespace velmora::cli
