#include "libvelmora/report/vehiclereport.h"

#include <fmt/format.h>

#include <cmath>

namespace velmora {

namespace {

// The voltage in the tenths that the adapter gives.
Json voltsOrNull(std::optional<float> const& volts)
{
    return volts ? Json(static_cast<double>(std::lround(*volts * 10.0F)) / 10.0) : Json(nullptr);
}

Json moduleJson(ModuleReport const& module)
{
    Json supported = Json::array();
    for (unsigned int const id : module.supported) {
        supported.push_back(fmt::format("{:02X}", id));
    }
    return {{"id", fmt::format("{:X}", module.id)},       {"name", textOrNull(module.name)},
            {"info", toJsonValue(module.info)},           {"sensors", supported},
            {"codes", toJsonValue(module.codes)},         {"freeze", toJsonValue(module.freeze)},
            {"readiness", toJsonValue(module.readiness)}, {"monitors", toJsonValue(module.monitors)},
            {"oxygen", toJsonValue(module.oxygen)},       {"counters", toJsonValue(module.counters)}};
}

} // namespace

std::string VehicleReport::toJson() const
{
    Json list = Json::array();
    for (ModuleReport const& module : modules) {
        list.push_back(moduleJson(module));
    }
    Json const document = {
        {"adapter",
         {{"device", textOrNull(adapter.device)},
          {"description", textOrNull(adapter.description)},
          {"identification", textOrNull(adapter.identification)},
          {"volts", voltsOrNull(adapter.volts)}}},
        {"protocol", {{"number", valueOrNull(protocol.number)}, {"name", textOrNull(protocol.name)}}},
        {"modules", list},
    };
    return printed(document);
}

} // namespace velmora
