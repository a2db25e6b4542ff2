#include "velmora/diagnosticreaders.h"

#include <algorithm>
#include <charconv>
#include <obd/idiagnosticsservice.h>

namespace velmora {

namespace {

constexpr unsigned int replyLimitMs = 1500;
// Info types of service 09: counters of engines with spark and with compression ignition.
constexpr unsigned char infoTypes[] = {0x08, 0x0B};

bool isOffered(obd::IEcu const& ecu, unsigned char infoType)
{
    return ecu.isSupported(obd::ObdMode::VehicleInformation, infoType, 0);
}

// Counters that are 0 stand in no list, so an empty one may be an answer or none.
bool answers(Session& session, obd::IEcu const& ecu)
{
    return std::any_of(std::begin(infoTypes), std::end(infoTypes), [&](unsigned char infoType) {
        obd::ResponseMap responses;
        if (!isOffered(ecu, infoType)) {
            return false;
        }
        session.proxy()->execute({0x09, infoType}, responses, replyLimitMs);
        auto const found = responses.find(ecu.id());
        return found != responses.end() && !found->second.empty() && found->second.front() == 0x49;
    });
}

unsigned int toNumber(std::string const& digits)
{
    unsigned int number = 0;
    std::from_chars(digits.data(), digits.data() + digits.size(), number);
    return number;
}

} // namespace

CountersReport readCounters(Session& session, obd::IEcu const& ecu)
{
    session.select(ecu);
    CountersReport report;
    if (std::none_of(std::begin(infoTypes), std::end(infoTypes),
                     [&ecu](unsigned char infoType) { return isOffered(ecu, infoType); })) {
        return report;
    }
    for (auto const& counter : obd::DiagnosticsServiceBuilder::create()->fetchPerformanceCounters()) {
        report.counters.push_back({counter->description, toNumber(counter->value)});
    }
    session.check();
    bool const told = !report.counters.empty() || answers(session, ecu);
    report.answer = told ? TopicAnswer::Read : TopicAnswer::Silent;
    session.check();
    return report;
}

} // namespace velmora
