#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/read/topicanswer.h"

#include <obd/idiagnosticsservice.h>
#include <obd/itroublecodeservice.h>

#include <algorithm>

namespace velmora {

namespace {

using Monitors = std::vector<std::shared_ptr<obd::ReadinessMonitorDataModel>>;

std::optional<ReadinessStatus> statusOf(Monitors const& monitors, std::string const& name)
{
    auto const found = std::find_if(monitors.begin(), monitors.end(),
                                    [&name](auto const& monitor) { return monitor->description == name; });
    return found != monitors.end() ? std::optional((*found)->status) : std::nullopt;
}

std::optional<bool> readLamp()
{
    auto const lamp = obd::TroubleCodeServiceBuilder::createTroubleCodeService()->askMilStatus().value;
    return lamp != nullptr ? std::optional(*lamp == obd::ITroubleCodeService::MilStatus::On) : std::nullopt;
}

} // namespace

ReadinessReport readReadiness(Session& session, obd::IEcu const& ecu)
{
    return readReadinessBeside(session, ecu, std::nullopt);
}

ReadinessReport readReadinessBeside(Session& session, obd::IEcu const& ecu, std::optional<bool> lamp)
{
    session.select(ecu);
    auto const service = obd::DiagnosticsServiceBuilder::create();
    auto const sinceCleared = service->askReadinessMonitors();
    session.check();
    if (!sinceCleared.isTold()) {
        return {toAnswer(sinceCleared), {}, {}};
    }
    ReadinessReport report{TopicAnswer::Read, lamp ? lamp : readLamp(), {}};
    session.check();
    Monitors const thisCycle = service->askReadinessMonitorsThisCycle().value;
    session.check();
    for (auto const& monitor : sinceCleared.value) {
        report.monitors.push_back({monitor->description, monitor->status, statusOf(thisCycle, monitor->description)});
    }
    return report;
}

} // namespace velmora
