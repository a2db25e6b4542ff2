#include "program/view/live/sensorpicker.h"

#include "common/text/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <utility>

namespace velmora::cli {

SensorPicker::SensorPicker(std::vector<LiveOffer> offered, std::vector<int> const& chosen)
{
    for (int const id : chosen) {
        auto const found = std::ranges::find(offered, id, &LiveOffer::id);
        if (found != offered.end()) {
            m_lines.push_back({*found, true});
            offered.erase(found);
        }
    }
    for (LiveOffer& each : offered) {
        m_lines.push_back({std::move(each), false});
    }
}

// The place so many lines from the cursor, as far as the list goes.
std::size_t SensorPicker::at(int lines) const
{
    std::ptrdiff_t const last = static_cast<std::ptrdiff_t>(m_lines.size()) - 1;
    std::ptrdiff_t const wanted = static_cast<std::ptrdiff_t>(m_cursor) + lines;
    return static_cast<std::size_t>(std::clamp(wanted, std::ptrdiff_t{0}, std::max(last, std::ptrdiff_t{0})));
}

void SensorPicker::move(int lines)
{
    m_cursor = at(lines);
}

void SensorPicker::toggle()
{
    if (m_cursor < m_lines.size()) {
        m_lines[m_cursor].marked = !m_lines[m_cursor].marked;
    }
}

void SensorPicker::carry(int lines)
{
    std::size_t const target = at(lines);
    if (m_cursor < m_lines.size()) {
        std::swap(m_lines[m_cursor], m_lines[target]);
        m_cursor = target;
    }
}

std::vector<int> SensorPicker::chosen() const
{
    std::vector<int> ids;
    for (Line const& each : m_lines) {
        if (each.marked) {
            ids.push_back(each.sensor.id);
        }
    }
    return ids;
}

std::string SensorPicker::draw(FrameStyle const& style) const
{
    std::size_t const room = style.rows > 3 ? style.rows - 3 : 1;
    std::size_t const first = m_cursor >= room ? m_cursor - room + 1 : 0;
    std::string text = looking(Look::Heading, cutTo("Which sensors, in which order?", style.columns), style) + "\n";
    for (std::size_t i = first; i < std::min(m_lines.size(), first + room); ++i) {
        Line const& each = m_lines[i];
        std::string const line = fmt::format("{} [{}] {:02X} {}", i == m_cursor ? ">" : " ", each.marked ? "x" : " ",
                                             each.sensor.id, each.sensor.title);
        text += looking(i == m_cursor ? Look::Marked : Look::Plain, cutTo(line, style.columns), style) + "\n";
    }
    return text + "\n" +
           cutTo("up, down move   space marks   + - carry   enter shows   esc leaves all as it was", style.columns) +
           "\n";
}

} // namespace velmora::cli
