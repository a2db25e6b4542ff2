#include "program/view/layout.h"
#include "program/view/reporttext.h"

namespace velmora::cli {

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

} // namespace

std::string toText(InfoReport const& report, Style const& /*style*/)
{
    return labelledLine("Description", report.description) + labelledLine("Standard", report.standard) +
           labelledLine("Protocol", report.protocol) + labelledLine("VIN", report.vin) +
           calibrationLines(report.calibrations) + labelledLine("Engine number", report.engineSerialNumber) +
           labelledLine("Type approval", report.erotan) + labelledLine("With lamp on", travelText(report.withLamp)) +
           labelledLine("Since cleared", travelText(report.sinceCleared));
}

} // namespace velmora::cli
