#include "libvelmora/report/inforeport.h"

#include "program/view/layout.h"

namespace velmora {

namespace {

std::string readingText(std::optional<InfoReport::Reading> const& reading)
{
    return reading ? reading->value + (reading->unit.empty() ? "" : " " + reading->unit) : std::string();
}

std::string travelText(InfoReport::Travel const& travel)
{
    std::string const distance = readingText(travel.distance);
    std::string const time = readingText(travel.runTime);
    std::string const engine = time.empty() ? "" : "engine ran " + time;
    return distance + (distance.empty() || engine.empty() ? "" : ", ") + engine;
}

std::string calibrationText(InfoReport::Calibration const& calibration)
{
    std::string const id = calibration.id.empty() ? "-" : calibration.id;
    return calibration.verification.empty() ? id : id + "  verification " + calibration.verification;
}

std::string calibrationLines(std::vector<InfoReport::Calibration> const& calibrations)
{
    if (calibrations.empty()) {
        return labelledLine("Calibration", {});
    }
    std::string text;
    for (InfoReport::Calibration const& calibration : calibrations) {
        text += labelledLine(text.empty() ? "Calibration" : "", calibrationText(calibration));
    }
    return text;
}

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

std::string toText(InfoReport const& report, Style const& /*style*/)
{
    return labelledLine("Description", report.description) + labelledLine("Standard", report.standard) +
           labelledLine("Protocol", report.protocol) + labelledLine("VIN", report.vin) +
           calibrationLines(report.calibrations) + labelledLine("Engine number", report.engineSerialNumber) +
           labelledLine("Type approval", report.erotan) + labelledLine("With lamp on", travelText(report.withLamp)) +
           labelledLine("Since cleared", travelText(report.sinceCleared));
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
