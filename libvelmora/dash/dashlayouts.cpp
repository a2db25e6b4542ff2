#include "libvelmora/dash/dashlayouts.h"

#include "libvelmora/session/settingsstore.h"

#include <velmora/error.h>

#include <algorithm>

namespace velmora {

namespace {

constexpr std::size_t longestLayout = 16 * 1024;
constexpr std::size_t mostIds = 64;
constexpr std::size_t longestSensorId = 64;
constexpr char const* sensorLists[] = {"gauges", "chart", "numbers"};

[[noreturn]] void rejectLayout(std::string const& why)
{
    throw Error(ErrorKind::WrongUse, "This is no layout: " + why);
}

// The key that keeps a vehicle's layout; what a path of keys is made of may not stand in it.
std::string layoutKey(std::string vehicle)
{
    std::ranges::replace_if(
        vehicle, [](unsigned char c) { return std::isalnum(c) == 0 && c != '-'; }, '_');
    return "layout/" + vehicle;
}

Json idsOf(Json const& value)
{
    if (!value.is_array() || value.size() > mostIds) {
        rejectLayout("sensors are a short list");
    }
    for (Json const& each : value) {
        if (!each.is_string() || each.get_ref<std::string const&>().size() > longestSensorId) {
            rejectLayout("sensors are short texts");
        }
    }
    return value;
}

Json wordOf(Json const& value, std::vector<std::string> const& words)
{
    if (!value.is_string() || std::ranges::find(words, value.get<std::string>()) == words.end()) {
        rejectLayout("a word in it is not known");
    }
    return value;
}

} // namespace

Json DashLayouts::parse(std::string const& text)
{
    Json const given = text.size() <= longestLayout ? Json::parse(text, nullptr, false) : Json();
    if (!given.is_object()) {
        rejectLayout("it is no object, or too long");
    }
    Json layout = Json::object();
    for (auto const& [key, value] : given.items()) {
        if (std::ranges::find(sensorLists, key) != std::end(sensorLists)) {
            layout[key] = idsOf(value);
        } else if (key == "units") {
            layout[key] = wordOf(value, {"metric", "imperial", "imperial-uk"});
        } else if (key == "theme") {
            layout[key] = wordOf(value, {"auto", "light", "dark"});
        } else if (key == "size") {
            layout[key] = wordOf(value, {"small", "normal", "large"});
        } else if (key == "minutes" && value.is_number_integer() && value >= 1 && value <= 15) {
            layout[key] = value;
        } else {
            rejectLayout("\"" + key + "\" does not belong there");
        }
    }
    return layout;
}

std::vector<std::string> DashLayouts::sensorsOf(Json const& layout)
{
    std::vector<std::string> ids;
    for (char const* const list : sensorLists) {
        for (Json const& each : layout.is_object() ? layout.value(list, Json::array()) : Json::array()) {
            std::string const id = each.get<std::string>();
            if (std::ranges::find(ids, id) == ids.end()) {
                ids.push_back(id);
            }
        }
    }
    return ids;
}

Json DashLayouts::load(std::string const& vehicle) const
{
    try {
        std::string text;
        SettingsStore store(m_file);
        return store.getString(layoutKey(vehicle), text) ? parse(text) : Json();
    } catch (Error const& /*unreadable*/) {
        return {};
    }
}

// Read anew each time: other programs keep layouts of their own vehicles there.
void DashLayouts::save(std::string const& vehicle, Json const& layout) const
{
    SettingsStore store(m_file);
    store.setString(layoutKey(vehicle), layout.dump());
    store.sync();
}

std::filesystem::path DashLayouts::besides(std::filesystem::path const& settings)
{
    return settings.parent_path() / "layouts.toml";
}

} // namespace velmora
