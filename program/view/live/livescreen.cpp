#include "program/view/live/livescreen.h"

#include "common/text/text.h"
#include "program/view/live/trendline.h"

#include <fmt/format.h>

#include <algorithm>

namespace velmora::cli {

namespace {

constexpr std::size_t shortestName = 18;
constexpr std::size_t shortestTrend = 16;
constexpr std::size_t frameLines = 4; // title, heading, an empty line, status

// Widths, and what stands beside name, value and unit, depending on the room there is.
struct Columns
{
    std::size_t name = shortestName;
    std::size_t value = displayWidth("Minimum");
    std::size_t unit = displayWidth("Unit");
    bool statistics = false;
    std::size_t trend = 0; // 0: none
};

void widen(std::size_t& width, std::string const& text)
{
    width = std::max(width, displayWidth(text));
}

// A mark that needs no colour.
std::string markedValue(LiveRow const& row)
{
    return (row.isOutside() ? "!" : "") + row.value;
}

// Numbers get all the room they need, for one that is cut would be another number; the name gets what is left, and the
// trend what the names leave.
Columns layOut(std::vector<LiveRow> const& rows, std::size_t width)
{
    Columns columns;
    for (LiveRow const& row : rows) {
        widen(columns.name, row.name);
        widen(columns.unit, row.unit);
        if (row.numeric) {
            for (std::string const& text : {markedValue(row), row.last, row.minimum, row.mean, row.maximum}) {
                widen(columns.value, text);
            }
        }
    }
    std::size_t used = (columns.value + 1) + (columns.unit + 1);
    std::size_t const statistics = 3 * (columns.value + 1);
    columns.statistics = width >= shortestName + used + statistics;
    used += columns.statistics ? statistics : 0;
    if (columns.statistics && width >= shortestName + used + 1 + shortestTrend) {
        std::size_t const beside = columns.name + used + 1;
        columns.trend = std::clamp(width > beside ? width - beside : 0, shortestTrend, LiveTable::trendLength);
        used += columns.trend + 1;
    }
    columns.name = std::min(columns.name, width > used ? width - used : shortestName);
    return columns;
}

std::string right(std::string const& text, Columns const& columns)
{
    return " " + fitted(text, columns.value, true);
}

std::string heading(Columns const& columns)
{
    std::string text = fitted("Sensor", columns.name) + right("Value", columns) + " " + fitted("Unit", columns.unit);
    if (columns.statistics) {
        text += right("Minimum", columns) + right("Mean", columns) + right("Maximum", columns);
    }
    return columns.trend > 0
               ? text + fmt::format(" Trend of {} s",
                                    columns.trend * static_cast<std::size_t>(LiveTable::trendStep.count()))
               : text;
}

// The last value of a sensor that tells none now, if its age can be told as well.
bool showsLast(LiveRow const& row, Columns const& columns)
{
    return row.value.empty() && !row.last.empty() && (columns.trend > 0 || !row.numeric);
}

std::string line(LiveRow const& row, Columns const& columns, FrameStyle const& style)
{
    std::string const age = ageText(style.now - row.updated);
    bool const last = showsLast(row, columns);
    std::string text = fitted(row.name, columns.name);
    if (!row.numeric) {
        // A text has neither unit nor statistics, so it may take their place.
        return text + " " + (last ? row.last + ", " + age : orDash(row.value));
    }
    text += right(last ? row.last : orDash(markedValue(row)), columns) + " " + fitted(row.unit, columns.unit);
    if (columns.statistics) {
        text += right(orDash(row.minimum), columns) + right(orDash(row.mean), columns) +
                right(orDash(row.maximum), columns);
    }
    if (columns.trend == 0) {
        return text;
    }
    return text + " " + (last ? fitted(age, columns.trend, true) : trendLine(row.trend, columns.trend, style.ascii));
}

Look lookOf(LiveRow const& row)
{
    if (row.value.empty() && !row.last.empty()) {
        return Look::Stale;
    }
    return row.isOutside() ? Look::Outside : Look::Plain;
}

} // namespace

std::size_t roomForRows(FrameStyle const& style)
{
    return style.rows > frameLines ? style.rows - frameLines : 1;
}

std::string drawTable(std::vector<LiveRow> const& rows, std::size_t first, std::string const& title,
                      std::string const& status, FrameStyle const& style)
{
    Columns const columns = layOut(rows, style.columns);
    std::string text = cutTo(title, style.columns) + "\n";
    text += looking(Look::Heading, cutTo(heading(columns), style.columns), style) + "\n";
    std::size_t const end = std::min(rows.size(), first + roomForRows(style));
    for (std::size_t i = first; i < end; ++i) {
        text += looking(lookOf(rows[i]), cutTo(line(rows[i], columns, style), style.columns), style) + "\n";
    }
    std::size_t const hidden = rows.size() - (end - std::min(first, end));
    std::string const more = hidden > 0 ? fmt::format("({} more: up and down) ", hidden) : "";
    return status.empty() ? text : text + "\n" + cutTo(more + status, style.columns) + "\n";
}

} // namespace velmora::cli
