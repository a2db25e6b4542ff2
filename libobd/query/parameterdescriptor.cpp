#include <obd/iecu.h>
#include <obd/parameterdescriptor.h>
#include <obd/powertrainparameter.h>

#include <algorithm>
#include <utility>

namespace obd {

ParameterDescriptor::ParameterDescriptor(std::shared_ptr<PowertrainParameter> parameter, std::shared_ptr<IEcu> ecu,
                                         UnitSystem system)
    : m_parameter(std::move(parameter)), m_ecu(std::move(ecu)), m_system(system)
{}

ParameterIdentifier::Id ParameterDescriptor::pid() const
{
    return m_parameter->pid();
}

std::string ParameterDescriptor::description() const
{
    return m_parameter->description(*m_ecu);
}

std::vector<std::shared_ptr<SensorDescriptor>> ParameterDescriptor::sensors() const
{
    std::vector<std::shared_ptr<SensorDescriptor>> descriptors;
    for (auto const& info : m_parameter->sensorInfo(*m_ecu)) {
        descriptors.push_back(std::make_shared<SensorDescriptor>(info, m_system));
    }
    return descriptors;
}

bool ParameterDescriptor::hasNumericSensors() const
{
    auto const infos = m_parameter->sensorInfo(*m_ecu);
    return std::any_of(infos.begin(), infos.end(), [](auto const& info) { return info->isNumeric(); });
}

} // namespace obd
