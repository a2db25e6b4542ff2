#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/read/topicanswer.h"

#include <obd/idiagnosticsservice.h>

#include <charconv>
#include <memory>

namespace velmora {

namespace {

unsigned int toNumber(std::string const& digits)
{
    unsigned int number = 0;
    std::from_chars(std::to_address(digits.begin()), std::to_address(digits.end()), number);
    return number;
}

} // namespace

CountersReport readCounters(Session& session, obd::IEcu const& ecu)
{
    session.select(ecu);
    auto const outcome = obd::DiagnosticsServiceBuilder::create()->askPerformanceCounters();
    session.check();
    CountersReport report{toAnswer(outcome), {}};
    for (auto const& counter : outcome.value) {
        report.counters.push_back({counter->description, toNumber(counter->value)});
    }
    return report;
}

} // namespace velmora
