#include "program/live/livelayouts.h"

#include "program/view/json.h"

#include <velmora/error.h>
#include <velmora/settingsfile.h>

namespace velmora::cli {

namespace {

constexpr std::size_t mostLayoutSensors = 300;
constexpr std::size_t longestLayoutWord = 64;

std::string liveKey(std::string const& vehicle)
{
    return "live/" + vehicle;
}

// Nothing for a text that save did not write.
std::optional<LiveLayout> parsedLayout(std::string const& text)
{
    Json const json = Json::parse(text, nullptr, false);
    if (!json.is_object() || !json.contains("sensors") || !json["sensors"].is_array() ||
        json["sensors"].size() > mostLayoutSensors) {
        return std::nullopt;
    }
    LiveLayout layout;
    for (Json const& each : json["sensors"]) {
        if (!each.is_string() || each.get_ref<std::string const&>().size() > longestLayoutWord) {
            return std::nullopt;
        }
        layout.sensors.push_back(each);
    }
    layout.big = !json.contains("big") || json["big"] != false;
    return layout;
}

} // namespace

std::optional<LiveLayout> LiveLayouts::load(std::string const& vehicle) const
{
    try {
        std::optional<std::string> const text = SettingsFile(m_file.string()).text(liveKey(vehicle));
        return text ? parsedLayout(*text) : std::nullopt;
    } catch (Error const& /*unreadable*/) {
        return std::nullopt;
    }
}

// Read anew each time: other programs keep layouts of their own vehicles there.
void LiveLayouts::save(std::string const& vehicle, LiveLayout const& layout) const
{
    SettingsFile(m_file.string())
        .setText(liveKey(vehicle), Json{{"sensors", layout.sensors}, {"big", layout.big}}.dump());
}

} // namespace velmora::cli
