#include "program/view/framestyle.h"

#include "common/text/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <string_view>
#include <utility>

namespace velmora::cli {

std::string looking(Look look, std::string const& text, FrameStyle const& style)
{
    if (!style.bold || look == Look::Plain) {
        return text;
    }
    char const* begin = "\033[1m";
    if (look == Look::Stale) {
        begin = "\033[2m";
    } else if (look == Look::Marked) {
        begin = "\033[7m";
    } else if (look == Look::Outside && style.coloured) {
        begin = "\033[1;31m";
    }
    return begin + text + "\033[0m";
}

std::string cutTo(std::string const& text, std::size_t columns)
{
    return displayWidth(text) > columns ? fitted(text, columns) : text;
}

std::string ageText(LiveTime::duration age)
{
    auto const seconds = std::chrono::duration_cast<std::chrono::seconds>(age).count();
    return seconds < 120 ? fmt::format("{} s ago", std::max<long>(seconds, 0))
                         : fmt::format("{} min ago", seconds / 60);
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
        std::size_t bytes = 1;
        while (bytes < rest.size() && (static_cast<unsigned char>(rest[bytes]) & 0xC0) == 0x80) {
            ++bytes;
        }
        result.append(displayWidth(rest.substr(0, bytes)), found == std::end(known) ? '?' : found->second);
        i += bytes;
    }
    return result;
}

} // namespace velmora::cli
