#include "common/text/layout.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/texts/labels.h"
#include "libvelmora/report/texts/plaintexts.h"

#include <fmt/format.h>

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
    std::string const engine = time.empty() ? "" : fmt::format(texts::plain::engineRan, time);
    return distance + (distance.empty() || engine.empty() ? "" : ", ") + engine;
}

std::string calibrationText(InfoReport::Calibration const& calibration)
{
    std::string const id = calibration.id.empty() ? "-" : calibration.id;
    return calibration.verification.empty() ? id
                                            : fmt::format(texts::plain::verification, id, calibration.verification);
}

std::string calibrationLines(std::vector<InfoReport::Calibration> const& calibrations)
{
    if (calibrations.empty()) {
        return labelledLine(texts::calibration, {});
    }
    std::string text;
    for (InfoReport::Calibration const& calibration : calibrations) {
        text += labelledLine(text.empty() ? texts::calibration : "", calibrationText(calibration));
    }
    return text;
}

} // namespace

std::string toText(InfoReport const& report, Style const& /*style*/)
{
    return labelledLine(texts::description, report.description) + labelledLine(texts::standard, report.standard) +
           labelledLine(texts::protocol, report.protocol) + labelledLine(texts::vin, report.vin) +
           calibrationLines(report.calibrations) + labelledLine(texts::plain::engineNumber, report.engineSerialNumber) +
           labelledLine(texts::plain::typeApproval, report.erotan) +
           labelledLine(texts::plain::withLamp, travelText(report.withLamp)) +
           labelledLine(texts::plain::sinceCleared, travelText(report.sinceCleared));
}

} // namespace velmora
