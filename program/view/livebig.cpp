#include "program/view/livebig.h"

#include "libvelmora/text/text.h"
#include "program/view/bigdigits.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <optional>
#include <string_view>

namespace velmora::cli {

namespace {

constexpr std::size_t mostBig = 6;
constexpr std::size_t narrowestCard = 26;
constexpr std::size_t tableLines = 12; // that the table keeps

std::optional<double> bigNumber(std::string const& text)
{
    double number = 0.0;
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    bool const whole = !text.empty() && error == std::errc() && end == text.data() + text.size();
    return whole && std::isfinite(number) ? std::optional(number) : std::nullopt;
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
    auto const value = bigNumber(row.value);
    auto const low = bigNumber(row.minimum);
    auto const high = bigNumber(row.maximum);
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

// Name, digits, bar: lines of that width.
std::vector<std::string> card(LiveRow const& row, std::size_t width, bool ascii)
{
    std::size_t const inner = width - 2;
    std::vector<std::string> result = {fitted(row.name, inner)};
    std::string const shown = row.value.empty() ? "-" : row.value;
    std::vector<std::string> digits = bigText(shown, ascii);
    if (digits.empty() || bigWidth(shown) + 1 + displayWidth(row.unit) > inner) {
        digits.assign(bigLines(ascii), "");
        digits[digits.size() / 2] = orDash(row.value);
    }
    digits.back() += " " + row.unit;
    for (std::string const& each : digits) {
        result.push_back(fitted(each, inner));
    }
    result.push_back(fitted(barLine(row, inner, ascii), inner));
    return result;
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
    std::size_t const height = bigLines(style.ascii) + 3; // name, digits, bar, an empty line
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
            std::vector<std::string> const part = card(*shown[i], width, style.ascii);
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

std::string toAscii(std::string const& text)
{
    static constexpr std::pair<std::string_view, char> known[] = {{"…", '.'}, {"°", 'o'}, {"²", '2'}, {"µ", 'u'}};
    std::string result;
    for (std::size_t i = 0; i < text.size();) {
        auto const byte = static_cast<unsigned char>(text[i]);
        if (byte < 0x80) {
            result += text[i++];
            continue;
        }
        std::string_view const rest = std::string_view(text).substr(i);
        auto const* const found =
            std::ranges::find_if(known, [&](auto const& each) { return rest.starts_with(each.first); });
        result += found == std::end(known) ? '?' : found->second;
        for (++i; i < text.size() && (static_cast<unsigned char>(text[i]) & 0xC0) == 0x80; ++i) {
            // what belongs to the same character
        }
    }
    return result;
}

} // namespace velmora::cli
