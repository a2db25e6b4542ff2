#include "velmora/view/freezereport.h"

#include <algorithm>
#include <fmt/format.h>
#include <nlohmann/json.hpp>

namespace velmora {

using Json = nlohmann::ordered_json;

namespace {

std::string toText(FreezeFrame const& frame)
{
    std::size_t width = 0;
    for (FreezeFrame::Reading const& reading : frame.readings) {
        width = std::max(width, reading.name.size());
    }
    std::string text = toText(frame.code, "  ");
    for (FreezeFrame::Reading const& reading : frame.readings) {
        bool const hasUnit = reading.value && !reading.unit.empty();
        text += fmt::format("  {:<{}}  {}{}{}\n", reading.name, width, reading.value.value_or("-"), hasUnit ? " " : "",
                            hasUnit ? reading.unit : "");
    }
    return text;
}

Json toJsonValue(FreezeFrame const& frame)
{
    Json readings = Json::array();
    for (FreezeFrame::Reading const& reading : frame.readings) {
        readings.push_back({{"name", reading.name},
                            {"value", reading.value ? Json(*reading.value) : Json(nullptr)},
                            {"unit", reading.unit.empty() ? Json(nullptr) : Json(reading.unit)}});
    }
    return {{"code", velmora::toJsonValue(frame.code)}, {"readings", readings}};
}

} // namespace

std::string toText(std::vector<ModuleFreeze> const& modules, unsigned int frame)
{
    std::string text;
    for (ModuleFreeze const& module : modules) {
        text += fmt::format("{}Control module {:X}: {}, freeze frame {}\n", text.empty() ? "" : "\n", module.id,
                            module.name, frame);
        if (module.frame) {
            text += toText(*module.frame);
        } else {
            text += module.offered ? "  none stored\n" : "  no answer\n";
        }
    }
    return text;
}

std::string toJson(std::vector<ModuleFreeze> const& modules, unsigned int frame)
{
    Json list = Json::array();
    for (ModuleFreeze const& module : modules) {
        list.push_back({{"id", fmt::format("{:X}", module.id)},
                        {"name", module.name},
                        {"frame", frame},
                        {"answered", module.offered},
                        {"freeze", module.frame ? toJsonValue(*module.frame) : Json(nullptr)}});
    }
    return list.dump(2, ' ', false, Json::error_handler_t::replace) + "\n";
}

} // namespace velmora
