#include "program/view/live/timebar.h"

#include <fmt/format.h>

#include <algorithm>

namespace velmora::cli {

namespace {

std::string clockText(std::int64_t millis)
{
    std::int64_t const seconds = millis / 1000;
    return seconds < 3600 ? fmt::format("{}:{:02}", seconds / 60, seconds % 60)
                          : fmt::format("{}:{:02}:{:02}", seconds / 3600, seconds / 60 % 60, seconds % 60);
}

} // namespace

std::string timeBar(std::int64_t position, std::int64_t begin, std::int64_t end, std::size_t width)
{
    double const share =
        end > begin ? std::clamp(static_cast<double>(position - begin) / static_cast<double>(end - begin), 0.0, 1.0)
                    : 1.0;
    auto const full = static_cast<std::size_t>(share * static_cast<double>(width));
    return fmt::format("{} [{}{}] {}", clockText(position - begin), std::string(full, '='),
                       std::string(width - full, '.'), clockText(end - begin));
}

} // namespace velmora::cli
