#include "libobd/service/sensorset.h"

#include "libobd/powertrain/boostpressure.h"
#include "libobd/service/sensormodels.h"

#include <obd/iecu.h>
#include <obd/parameterdescriptor.h>
#include <obd/parameterfactory.h>
#include <obd/powertrainparameter.h>
#include <obd/sensordatamodels.h>
#include <obd/sensorinfo.h>
#include <obd/sensorpids.h>
#include <obd/sensorvalue.h>

#include <utility>

namespace obd {
SensorSet::SensorSet(std::shared_ptr<IEcu> ecu, IVelmoraSettings const& settings) : m_ecu(std::move(ecu))
{
    if (m_ecu == nullptr) {
        return;
    }
    std::vector<ParameterIdentifier::Id> ids = supportedIds(*m_ecu);
    for (ParameterIdentifier::Id const derived :
         {ParameterIdentifier::FuelConsumption, ParameterIdentifier::BatteryVoltage, ParameterIdentifier::EnginePower,
          ParameterIdentifier::Torque}) {
        ids.push_back(derived);
    }
    if (BoostPressure::isValid(*m_ecu)) {
        ids.push_back(ParameterIdentifier::BoostPressure);
    }
    ParameterFactory factory;
    for (ParameterIdentifier::Id const id : ids) {
        if (std::shared_ptr<PowertrainParameter> const parameter = factory.createParameter(*m_ecu, settings, id)) {
            add(parameter);
        }
    }
    restartStatistics();
}

void SensorSet::add(std::shared_ptr<PowertrainParameter> const& parameter)
{
    // A module may report a PID whose number the library gave to a derived parameter: that one replaces it.
    m_parameters.insert_or_assign(parameter->pid(), parameter);
    m_queries.insert_or_assign(parameter->pid(), std::make_shared<ParameterQuery>(parameter));
}

std::vector<ParameterIdentifier::Id> SensorSet::supportedIds(IEcu const& ecu)
{
    std::vector<ParameterIdentifier::Id> ids;
    for (unsigned char const id : ecu.supportedIds(ObdMode::CurrentData, 0)) {
        if (isSensor(id)) {
            ids.push_back(ParameterIdentifier(id).id());
        }
    }
    return ids;
}

std::vector<std::shared_ptr<ParameterDescriptor>> SensorSet::descriptors(UnitSystem system) const
{
    std::vector<std::shared_ptr<ParameterDescriptor>> list;
    for (auto const& [id, parameter] : m_parameters) {
        list.push_back(std::make_shared<ParameterDescriptor>(parameter, m_ecu, system));
    }
    return list;
}

std::shared_ptr<SensorSet::ParameterQuery> SensorSet::query(ParameterIdentifier::Id id) const
{
    auto const found = m_queries.find(id);
    return found != m_queries.end() ? found->second : nullptr;
}

SensorSet::Models SensorSet::record(std::vector<std::shared_ptr<SensorValue>> const& values)
{
    Models models;
    for (std::shared_ptr<SensorValue> const& value : values) {
        if (m_sensorData.contains(value->uid())) {
            models.push_back(record(value));
        }
    }
    return models;
}

std::shared_ptr<SensorValueDataModel> SensorSet::record(std::shared_ptr<SensorValue> const& value)
{
    auto const found = m_sensorData.find(value->uid());
    if (found == m_sensorData.end()) {
        return makeValueModel(value);
    }
    found->second->update(value);
    return found->second->model();
}

void SensorSet::cancelAll()
{
    for (auto const& [id, query] : m_queries) {
        query->cancel();
    }
}

void SensorSet::clear()
{
    m_sensorData.clear();
    m_queries.clear();
    m_parameters.clear();
    m_ecu.reset();
}

void SensorSet::restartStatistics()
{
    m_sensorData.clear();
    for (auto const& [id, parameter] : m_parameters) {
        for (std::shared_ptr<SensorInfo const> const& info : parameter->sensorInfo(*m_ecu)) {
            m_sensorData[info->uid()] = std::make_shared<SensorData>(info->uid());
        }
    }
}

} // namespace obd
