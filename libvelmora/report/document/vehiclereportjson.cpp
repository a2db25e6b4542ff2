#include "libvelmora/report/document/vehiclereportjson.h"

#include "libvelmora/report/finding/findings.h"

#include <fmt/format.h>

#include <cmath>

namespace velmora {

namespace {

// The voltage in the tenths that the adapter gives.
Json voltsOrNull(std::optional<float> const& volts)
{
    return volts ? Json(static_cast<double>(std::lround(*volts * 10.0F)) / 10.0) : Json(nullptr);
}

Json toJsonValue(std::vector<LiveValue> const& values)
{
    Json list = Json::array();
    for (LiveValue const& value : values) {
        list.push_back({{"pid", fmt::format("{:02X}", value.pid)},
                        {"part", value.part},
                        {"name", value.name},
                        {"value", textOrNull(value.value)},
                        {"unit", textOrNull(value.unit)},
                        {"samples", value.samples}});
    }
    return list;
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
            {"oxygen", toJsonValue(module.oxygen)},       {"counters", toJsonValue(module.counters)},
            {"supported", answerWord(module.offers)},     {"values", toJsonValue(module.values)}};
}

} // namespace

Json toJsonValue(VehicleReport const& report)
{
    Json list = Json::array();
    for (ModuleReport const& module : report.modules) {
        list.push_back(moduleJson(module));
    }
    return {
        {"adapter",
         {{"device", textOrNull(report.adapter.device)},
          {"description", textOrNull(report.adapter.description)},
          {"identification", textOrNull(report.adapter.identification)},
          {"volts", voltsOrNull(report.adapter.volts)}}},
        {"protocol", {{"number", valueOrNull(report.protocol.number)}, {"name", textOrNull(report.protocol.name)}}},
        {"findings", toJsonValue(findings(report), report)},
        {"modules", list},
    };
}

std::string VehicleReport::toJson() const
{
    return printed(toJsonValue(*this));
}

} // namespace velmora
