#include "program/view/livescreen.h"

#include "libvelmora/text/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>

namespace velmora::cli {

namespace {

constexpr std::size_t shortestName = 18;
constexpr std::size_t frameLines = 4; // title, heading, an empty line, status

// Widths, and what stands beside name, value and unit, depending on the room there is.
struct Columns
{
    std::size_t name = shortestName;
    std::size_t value = displayWidth("Minimum");
    std::size_t unit = displayWidth("Unit");
    bool statistics = false;
    bool trend = false;
};

void widen(std::size_t& width, std::string const& text)
{
    width = std::max(width, displayWidth(text));
}

// Numbers get all the room they need, for one that is cut would be another number; the name gets what is left.
Columns layOut(std::vector<LiveRow> const& rows, std::size_t width)
{
    Columns columns;
    for (LiveRow const& row : rows) {
        widen(columns.name, row.name);
        widen(columns.unit, row.unit);
        if (row.numeric) {
            for (std::string const* const text : {&row.value, &row.minimum, &row.mean, &row.maximum}) {
                widen(columns.value, *text);
            }
        }
    }
    std::size_t used = (columns.value + 1) + (columns.unit + 1);
    std::size_t const statistics = 3 * (columns.value + 1);
    std::size_t const trend = LiveTable::trendLength + 1;
    columns.statistics = width >= shortestName + used + statistics;
    used += columns.statistics ? statistics : 0;
    columns.trend = columns.statistics && width >= shortestName + used + trend;
    used += columns.trend ? trend : 0;
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
    return text + (columns.trend ? " Trend" : "");
}

std::string line(LiveRow const& row, Columns const& columns, bool ascii)
{
    std::string text = fitted(row.name, columns.name);
    if (!row.numeric) {
        // A text has neither unit nor statistics, so it may take their place.
        return text + " " + orDash(row.value);
    }
    text += right(orDash(row.value), columns) + " " + fitted(row.unit, columns.unit);
    if (columns.statistics) {
        text += right(orDash(row.minimum), columns) + right(orDash(row.mean), columns) +
                right(orDash(row.maximum), columns);
    }
    return text + (columns.trend ? " " + trendLine(row.trend, LiveTable::trendLength, ascii) : "");
}

std::string emphasised(std::string const& text, FrameStyle const& style)
{
    return style.bold ? "\033[1m" + text + "\033[0m" : text;
}

std::string cut(std::string const& text, std::size_t width)
{
    return displayWidth(text) > width ? fitted(text, width) : text;
}

} // namespace

std::string trendLine(std::deque<double> const& numbers, std::size_t width, bool ascii)
{
    static constexpr char const* blocks[] = {"▁", "▂", "▃", "▄", "▅", "▆", "▇", "█"};
    static constexpr char const* signs[] = {".", ":", "-", "=", "+", "*", "%", "#"};
    std::size_t const count = std::min(width, numbers.size());
    std::string text(width - count, ' ');
    if (count == 0) {
        return text;
    }
    auto const first = numbers.end() - static_cast<std::ptrdiff_t>(count);
    double const low = *std::min_element(first, numbers.end());
    double const range = *std::max_element(first, numbers.end()) - low;
    for (auto number = first; number != numbers.end(); ++number) {
        double const part = range > 0.0 ? (*number - low) / range : 0.0;
        text += (ascii ? signs : blocks)[static_cast<std::size_t>(std::lround(part * 7.0))];
    }
    return text;
}

std::size_t roomForRows(FrameStyle const& style)
{
    return style.rows > frameLines ? style.rows - frameLines : 1;
}

std::string drawTable(std::vector<LiveRow> const& rows, std::size_t first, std::string const& title,
                      std::string const& status, FrameStyle const& style)
{
    Columns const columns = layOut(rows, style.columns);
    std::string text = cut(title, style.columns) + "\n";
    text += emphasised(cut(heading(columns), style.columns), style) + "\n";
    std::size_t const end = std::min(rows.size(), first + roomForRows(style));
    for (std::size_t i = first; i < end; ++i) {
        text += cut(line(rows[i], columns, style.ascii), style.columns) + "\n";
    }
    std::size_t const hidden = rows.size() - (end - std::min(first, end));
    std::string const more = hidden > 0 ? fmt::format("({} more: up and down) ", hidden) : "";
    return status.empty() ? text : text + "\n" + cut(more + status, style.columns) + "\n";
}

SensorPicker::SensorPicker(std::vector<OfferedSensor> offered, SensorIds const& chosen)
    : m_offered(std::move(offered)), m_before(chosen), m_marked(chosen.begin(), chosen.end())
{}

void SensorPicker::move(int lines)
{
    std::ptrdiff_t const last = static_cast<std::ptrdiff_t>(m_offered.size()) - 1;
    std::ptrdiff_t const wanted = static_cast<std::ptrdiff_t>(m_cursor) + lines;
    m_cursor = static_cast<std::size_t>(std::clamp(wanted, std::ptrdiff_t{0}, std::max(last, std::ptrdiff_t{0})));
}

void SensorPicker::toggle()
{
    if (m_cursor < m_offered.size()) {
        obd::ParameterIdentifier::Id const id = m_offered[m_cursor].id;
        if (m_marked.erase(id) == 0) {
            m_marked.insert(id);
        }
    }
}

SensorIds SensorPicker::chosen() const
{
    SensorIds ids;
    auto const isMarked = [this](obd::ParameterIdentifier::Id id) { return m_marked.contains(id); };
    std::copy_if(m_before.begin(), m_before.end(), std::back_inserter(ids), isMarked);
    for (OfferedSensor const& each : m_offered) {
        if (isMarked(each.id) && std::find(ids.begin(), ids.end(), each.id) == ids.end()) {
            ids.push_back(each.id);
        }
    }
    return ids;
}

std::string SensorPicker::draw(FrameStyle const& style) const
{
    std::size_t const room = style.rows > 3 ? style.rows - 3 : 1;
    std::size_t const first = m_cursor >= room ? m_cursor - room + 1 : 0;
    std::string text = emphasised(cut("Which sensors?", style.columns), style) + "\n";
    for (std::size_t i = first; i < std::min(m_offered.size(), first + room); ++i) {
        OfferedSensor const& each = m_offered[i];
        text += cut(fmt::format("{} [{}] {:02X} {}", i == m_cursor ? ">" : " ", m_marked.contains(each.id) ? "x" : " ",
                                static_cast<int>(each.id), each.title),
                    style.columns) +
                "\n";
    }
    return text + "\n" + cut("up, down move   space marks   enter shows   esc leaves all as it was", style.columns) +
           "\n";
}

} // namespace velmora::cli
