#include "libvelmora/read/diagnosticreaders.h"

#include <obd/idiagnosticsservice.h>

#include <algorithm>
#include <charconv>

namespace velmora {

namespace {

constexpr unsigned int countersLimitMs = 1500;
// Info types of service 09: counters of engines with spark and with compression ignition.
constexpr unsigned char infoTypes[] = {0x08, 0x0B};

bool isOffered(obd::IEcu const& ecu, unsigned char infoType)
{
    return ecu.isSupported(obd::ObdMode::VehicleInformation, infoType, 0);
}

// Counters that are 0 stand in no list, so an empty list may be an answer, one that can't be decoded, or none.
TopicAnswer answerWithoutCounters(Session& session, obd::IEcu const& ecu)
{
    auto const offered = std::find_if(std::begin(infoTypes), std::end(infoTypes),
                                      [&ecu](unsigned char infoType) { return isOffered(ecu, infoType); });
    obd::ResponseMap responses;
    session.proxy()->execute({0x09, *offered}, responses, countersLimitMs);
    return judgeWithoutCounters(responses[ecu.id()], ecu.protocol());
}

unsigned int toNumber(std::string const& digits)
{
    unsigned int number = 0;
    std::from_chars(digits.data(), digits.data() + digits.size(), number);
    return number;
}

} // namespace

TopicAnswer judgeWithoutCounters(std::vector<unsigned char> const& reply, obd::ObdProtocol protocol)
{
    if (reply.empty() || reply.front() != 0x49) {
        return TopicAnswer::Silent;
    }
    bool const can = protocol == obd::ObdProtocolCan11 || protocol == obd::ObdProtocolCan29;
    std::size_t const heading = 3; // service, info type, count of items
    bool const zeros = reply.size() <= heading ||
                       std::all_of(reply.begin() + heading, reply.end(), [](unsigned char byte) { return byte == 0; });
    return can && !zeros ? TopicAnswer::Unreadable : TopicAnswer::Read;
}

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
    report.answer = report.counters.empty() ? answerWithoutCounters(session, ecu) : TopicAnswer::Read;
    session.check();
    return report;
}

} // namespace velmora
