#include "program/view/live/livehelp.h"

#include <fmt/format.h>

namespace velmora::cli {

std::string drawHelp(std::vector<std::pair<std::string, std::string>> const& further, FrameStyle const& style)
{
    std::vector<std::pair<std::string, std::string>> keys = {
        {"q", "quit"},
        {"s", "choose sensors and their order"},
        {"b", "big digits on and off, of the first six sensors"},
        {"h, space", "hold the screen, and let it go on"},
        {"up, down", "move the table, by pages with page up and down"},
    };
    keys.insert(keys.end(), further.begin(), further.end());
    std::string text = looking(Look::Heading, cutTo("Keys", style.columns), style) + "\n";
    for (auto const& [key, meaning] : keys) {
        text += cutTo(fmt::format("  {:<10} {}", key, meaning), style.columns) + "\n";
    }
    text +=
        "\n" + cutTo("A value beyond its limit has a !. A dim one is old, and tells its age.", style.columns) + "\n";
    return text + cutTo("Any key goes back", style.columns) + "\n";
}

} // namespace velmora::cli
