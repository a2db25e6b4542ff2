#include "program/view/live/trendline.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace velmora::cli {

std::string trendLine(std::deque<double> const& numbers, std::size_t width, bool ascii)
{
    static constexpr char const* blocks[] = {"▁", "▂", "▃", "▄", "▅", "▆", "▇", "█"};
    static constexpr char const* signs[] = {".", ":", "-", "=", "+", "*", "%", "#"};
    std::size_t const count = std::min(width, numbers.size());
    auto const first = numbers.end() - static_cast<std::ptrdiff_t>(count);
    double low = std::numeric_limits<double>::infinity();
    double high = -low;
    for (auto number = first; number != numbers.end(); ++number) {
        low = std::isnan(*number) ? low : std::min(low, *number);
        high = std::isnan(*number) ? high : std::max(high, *number);
    }
    std::string text(width - count, ' ');
    for (auto number = first; number != numbers.end(); ++number) {
        double const part = high > low ? (*number - low) / (high - low) : 0.0;
        text += std::isnan(*number) ? " " : (ascii ? signs : blocks)[static_cast<std::size_t>(std::lround(part * 7.0))];
    }
    return text;
}

} // namespace velmora::cli
