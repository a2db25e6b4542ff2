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

std::string toJson(VehicleReport const& report)
{
    Json modules = Json::array();
    for (ModuleReport const& module : report.modules) {
        modules.push_back(moduleJson(module));
    }
    Json const document = {
        {"adapter",
         {{"device", textOrNull(report.adapter.device)},
          {"description", textOrNull(report.adapter.description)},
          {"identification", textOrNull(report.adapter.identification)},
          {"volts", voltsOrNull(report.adapter.volts)}}},
        {"protocol", {{"number", valueOrNull(report.protocol.number)}, {"name", textOrNull(report.protocol.name)}}},
        {"modules", modules},
    };
    return printed(document);
}

} // namespace velmora
