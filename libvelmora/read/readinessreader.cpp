#include "libvelmora/read/diagnosticreaders.h"

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
    auto const lamp = obd::TroubleCodeServiceBuilder::createTroubleCodeService()->fetchMilStatus();
    return lamp != nullptr ? std::optional(*lamp == obd::ITroubleCodeService::MilStatus::On) : std::nullopt;
}

} // namespace

bool tellsReadiness(obd::IEcu const& ecu)
{
    return ecu.isSupported(obd::ObdMode::CurrentData, 0x01, 0);
}

ReadinessReport readReadiness(Session& session, obd::IEcu const& ecu)
{
    session.select(ecu);
    if (!tellsReadiness(ecu)) {
        return {};
    }
    auto const service = obd::DiagnosticsServiceBuilder::create();
    Monitors const sinceCleared = service->fetchReadinessMonitors();
    session.check();
    if (sinceCleared.empty()) {
        return {TopicAnswer::Silent, {}, {}};
    }
    ReadinessReport report{TopicAnswer::Read, readLamp(), {}};
    session.check();
    Monitors const thisCycle = service->fetchReadinessMonitorsThisCycle();
    session.check();
    for (auto const& monitor : sinceCleared) {
        report.monitors.push_back({monitor->description, monitor->status, statusOf(thisCycle, monitor->description)});
    }
    return report;
}

} // namespace velmora
