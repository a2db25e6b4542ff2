#include "libobd/powertrain/derivedparameter.h"

#include <common/clock.h>
#include <obd/iobdproxy.h>
#include <obd/sensorinfo.h>
#include <obd/sensorvalue.h>

#include <algorithm>
#include <iterator>

namespace obd {
namespace {

std::shared_ptr<SensorInfo const> makeInfo(DerivedRow const& row)
{
    auto info = std::make_shared<SensorInfo>(Pid2Uid(row.id), row.title, true);
    info->add(UnitSystem::Metric, row.metric.unit, row.metric.minimum, row.metric.maximum);
    info->add(UnitSystem::Imperial, row.imperial.unit, row.imperial.minimum, row.imperial.maximum);
    return info;
}

} // namespace

DerivedParameter::DerivedParameter(DerivedRow const& row)
    : PowertrainParameter(ObdMode::CurrentData, 0), m_row(row), m_info(makeInfo(row))
{}

ParameterIdentifier::Id DerivedParameter::pid() const
{
    return m_row.id;
}

std::string DerivedParameter::description(IEcu const& /*ecu*/)
{
    return m_row.title;
}

std::vector<std::shared_ptr<SensorInfo const>> DerivedParameter::sensorInfo(IEcu const& /*ecu*/)
{
    return {m_info};
}

std::vector<std::shared_ptr<SensorValue>> DerivedParameter::values(IEcu const& ecu, UnitSystem system)
{
    return {ConcreateNumericSensorValue<double>::buildObject(m_info->uid(), value(ecu, system), m_row.decimals)};
}

DerivedParameter::Ecus DerivedParameter::choose(Ecus const& ecus, std::function<bool(IEcu const&)> const& valid)
{
    Ecus chosen;
    std::copy_if(ecus.begin(), ecus.end(), std::back_inserter(chosen),
                 [&valid](std::shared_ptr<IEcu> const& ecu) { return valid(*ecu); });
    return chosen;
}

bool DerivedParameter::poll(TableParameter& input, std::shared_ptr<IObdProxy> const& proxy, Ecus const& ecus,
                            Feed const& feed)
{
    if (input.update(proxy) != UpdateStatus::UpdateOk) {
        return false;
    }
    std::uint32_t const time = tervex::currentMillis();
    for (std::shared_ptr<IEcu> const& ecu : ecus) {
        if (std::optional<double> const reading = input.stored(*ecu)) {
            feed(*ecu, {time, *reading});
        }
    }
    return true;
}

void DerivedParameter::judge(Ecus const& ecus, Inputs const& inputs)
{
    judge(ecus, [&inputs](IEcu const&) { return inputs; });
}

void DerivedParameter::judge(Ecus const& ecus, std::function<Inputs(IEcu const&)> const& inputsOf)
{
    m_verdicts.clear();
    for (std::shared_ptr<IEcu> const& ecu : ecus) {
        Inputs const inputs = inputsOf(*ecu);
        auto const missing = std::find_if(inputs.begin(), inputs.end(),
                                          [&ecu](PowertrainParameter const* input) { return !input->delivered(*ecu); });
        m_verdicts[ecu->id()] = missing != inputs.end() ? (*missing)->verdict(*ecu) : Verdict{};
    }
}

Verdict DerivedParameter::verdict(IEcu const& ecu) const
{
    auto const found = m_verdicts.find(ecu.id());
    return found != m_verdicts.end() ? found->second : Verdict{OutcomeKind::NotOffered};
}

void DerivedParameter::getRequestData(std::vector<unsigned char>& data) const
{
    data.clear();
}

void DerivedParameter::getSignature(std::vector<unsigned char>& signature) const
{
    signature.clear();
}

bool DerivedParameter::fromBytes(std::shared_ptr<IEcu> const& /*ecu*/, std::vector<unsigned char> const& /*data*/)
{
    return false;
}

bool DerivedParameter::fromPayload(std::shared_ptr<IEcu> const& /*ecu*/, std::vector<unsigned char> const& /*payload*/)
{
    return false;
}

} // namespace obd
