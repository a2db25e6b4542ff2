#include "libobd/service/ask.h"

#include <obd/nack.h>

#include <algorithm>

namespace obd {

bool lacks(IEcu const& module, std::optional<Needed> const& needed)
{
    if (!needed) {
        return false;
    }
    switch (module.detection(needed->mode, needed->frame).kind) {
    case OutcomeKind::Answered:
    case OutcomeKind::Refused:
        return !module.isSupported(needed->mode, needed->id, needed->frame);
    default:
        return false;
    }
}

bool holdsNothing(std::string const& text)
{
    return text.empty();
}

bool holdsNothing(bool /*flag*/)
{
    return false;
}

bool holdsNothing(std::shared_ptr<ParameterDataModel> const& parameter)
{
    return parameter == nullptr || holdsNothing(parameter->sensors);
}

bool holdsNothing(std::vector<std::shared_ptr<SensorDataModel>> const& sensors)
{
    return std::none_of(sensors.begin(), sensors.end(), [](auto const& sensor) { return sensor->value != nullptr; });
}

bool holdsNothing(std::vector<std::shared_ptr<ReadinessMonitorDataModel>> const& monitors)
{
    return std::all_of(monitors.begin(), monitors.end(),
                       [](auto const& monitor) { return monitor->status == ReadinessMonitorDataModel::NotAvailable; });
}

Verdict judged(BaseService const& service, Verdict const& verdict)
{
    if (verdict.kind == OutcomeKind::Refused &&
        (verdict.code == NackServiceNotSupported || verdict.code == NackSubfunctionNotSupported)) {
        return {OutcomeKind::NotOffered, verdict.code};
    }
    if (verdict.kind == OutcomeKind::ModuleSilent && !service.isConnected()) {
        return {OutcomeKind::NotConnected};
    }
    return verdict;
}

void AskedTimes::add(Verdict const& verdict)
{
    if (verdict.isTold()) {
        m_told = true;
        return;
    }
    if (m_missing++ == 0) {
        m_first = verdict;
    }
}

} // namespace obd
