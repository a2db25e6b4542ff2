#include "libvelmora/report/inforeport.h"

#include <algorithm>

namespace velmora {

namespace {

Json toJsonValue(std::optional<InfoReport::Reading> const& reading)
{
    return reading ? Json{{"value", reading->value}, {"unit", textOrNull(reading->unit)}} : Json(nullptr);
}

Json toJsonValue(InfoReport::Travel const& travel)
{
    return {{"distance", toJsonValue(travel.distance)}, {"runTime", toJsonValue(travel.runTime)}};
}

} // namespace

std::vector<InfoReport::Calibration> pairCalibrations(std::vector<std::string> const& ids,
                                                      std::vector<std::string> const& verifications)
{
    std::vector<InfoReport::Calibration> pairs(std::max(ids.size(), verifications.size()));
    for (std::size_t i = 0; i < ids.size(); ++i) {
        pairs[i].id = ids[i];
    }
    for (std::size_t i = 0; i < verifications.size(); ++i) {
        pairs[i].verification = verifications[i];
    }
    return pairs;
}

Json toJsonValue(InfoReport const& report)
{
    Json calibrations = Json::array();
    for (InfoReport::Calibration const& calibration : report.calibrations) {
        calibrations.push_back(
            {{"id", textOrNull(calibration.id)}, {"verification", textOrNull(calibration.verification)}});
    }
    return {{"description", textOrNull(report.description)},
            {"standard", textOrNull(report.standard)},
            {"protocol", textOrNull(report.protocol)},
            {"vin", textOrNull(report.vin)},
            {"calibrations", calibrations},
            {"engineSerialNumber", textOrNull(report.engineSerialNumber)},
            {"erotan", textOrNull(report.erotan)},
            {"withLamp", toJsonValue(report.withLamp)},
            {"sinceCleared", toJsonValue(report.sinceCleared)}};
}

} // namespace velmora
