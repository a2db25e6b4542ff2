#include "program/view/live/livebig.h"

#include "common/text/text.h"
#include "program/view/live/bigdigits.h"
#include "program/view/live/trendline.h"

#include <algorithm>
#include <cmath>

namespace velmora::cli {

namespace {

constexpr std::size_t mostBig = 6;
constexpr std::size_t narrowestCard = 26;
constexpr std::size_t tableLines = 12; // that the table keeps
constexpr std::size_t tallScreen = 40; // lines

bool isTall(FrameStyle const& style)
{
    return style.rows >= tallScreen;
}

std::string repeated(char const* text, std::size_t count)
{
    std::string result;
    for (std::size_t i = 0; i < count; ++i) {
        result += text;
    }
    return result;
}

std::string barLine(LiveRow const& row, std::size_t width, bool ascii)
{
    auto const value = numberIn(row.value);
    auto const low = numberIn(row.minimum);
    auto const high = numberIn(row.maximum);
    if (!value || !low || !high) {
        return std::string(width, ' ');
    }
    std::size_t const ends = displayWidth(row.minimum) + displayWidth(row.maximum) + 2;
    std::size_t const length = width > ends + 4 ? width - ends : 0;
    double const share = *high > *low ? std::clamp((*value - *low) / (*high - *low), 0.0, 1.0) : 1.0;
    auto const full = static_cast<std::size_t>(std::lround(share * static_cast<double>(length)));
    return row.minimum + " " + repeated(ascii ? "=" : "━", full) + repeated(ascii ? "." : "┈", length - full) + " " +
           row.maximum;
}

// What stands below the digits: the bar, or how old the value is that stood there.
std::string footLine(LiveRow const& row, std::size_t width, FrameStyle const& style)
{
    if (row.value.empty() && !row.last.empty()) {
        return "was " + row.last + ", " + ageText(style.now - row.updated);
    }
    return barLine(row, width, style.ascii);
}

// Lines of that width: name, digits, bar, and on a tall screen the trend.
std::vector<std::string> card(LiveRow const& row, std::size_t width, FrameStyle const& style)
{
    std::size_t const inner = width - 2;
    std::string const mark = row.isOutside() ? "! " : "";
    std::vector<std::string> lines = {mark + row.name};
    std::string const shown = row.value.empty() ? "-" : row.value;
    std::vector<std::string> digits = bigText(shown, style.ascii);
    if (digits.empty() || bigWidth(shown) + 1 + displayWidth(row.unit) > inner) {
        digits.assign(bigLines(style.ascii), "");
        digits[digits.size() / 2] = orDash(row.value);
    }
    digits.back() += " " + row.unit;
    lines.insert(lines.end(), digits.begin(), digits.end());
    lines.push_back(footLine(row, inner, style));
    if (isTall(style)) {
        lines.push_back(trendLine(row.trend, std::min(inner, LiveTable::trendLength), style.ascii));
    }
    Look const look = row.isOutside() ? Look::Outside : row.value.empty() ? Look::Stale : Look::Plain;
    for (std::string& each : lines) {
        each = looking(look, fitted(each, inner), style);
    }
    return lines;
}

} // namespace

std::string drawBig(std::vector<LiveRow> const& rows, FrameStyle const& style)
{
    std::vector<LiveRow const*> shown;
    for (LiveRow const& row : rows) {
        if (row.numeric && shown.size() < mostBig) {
            shown.push_back(&row);
        }
    }
    std::size_t const across = std::max<std::size_t>(1, std::min(mostBig, style.columns / narrowestCard));
    std::size_t const height = bigLines(style.ascii) + (isTall(style) ? 4 : 3); // name, bar, trend, an empty line
    std::size_t const room = style.rows > tableLines ? (style.rows - tableLines) / height : 0;
    shown.resize(std::min(shown.size(), across * room));
    std::size_t const width = shown.empty() ? 0 : style.columns / std::min(across, shown.size());
    if (width < narrowestCard) {
        return {};
    }
    std::string text;
    for (std::size_t first = 0; first < shown.size(); first += across) {
        std::vector<std::string> lines(height - 1);
        for (std::size_t i = first; i < std::min(first + across, shown.size()); ++i) {
            std::vector<std::string> const part = card(*shown[i], width, style);
            for (std::size_t line = 0; line < part.size(); ++line) {
                lines[line] += part[line] + "  ";
            }
        }
        for (std::string const& line : lines) {
            text += line + "\n";
        }
        text += "\n";
    }
    return text;
}

} // namespace velmora::cli
