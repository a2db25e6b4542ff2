#include "libobd/service/sensorservice.h"

#include "libobd/service/builtservice.h"
#include "libobd/service/parametercatalogue.h"
#include "libobd/service/sensormodels.h"

#include <common/logrecord.h>
#include <obd/iecu.h>
#include <obd/iobdvelmora.h>
#include <obd/ivelmorasettings.h>
#include <obd/parameterdescriptor.h>
#include <obd/parameterfactory.h>
#include <obd/powertrainparameter.h>
#include <obd/sensordatamodels.h>
#include <obd/sensorvalue.h>

#include <utility>

namespace obd {
namespace {

bool isDerived(ParameterIdentifier::Id id)
{
    return !ParameterFactory::dataLength(id);
}

} // namespace

SensorService::SensorService(IObdVelmora const* obd, Following following)
    : BaseService(obd, servicePriority, following), m_settings(obd->getSettings())
{
    if (following == Following::AtOnce) {
        followVehicle();
    }
}

SensorService::~SensorService()
{
    m_settings->detach(&m_vehicleListener);
    std::lock_guard const lock(m_mutex);
    m_set.cancelAll();
}

void SensorService::startFollowing()
{
    BaseService::startFollowing();
    followVehicle();
}

void SensorService::stopFollowing()
{
    m_settings->detach(&m_vehicleListener);
    BaseService::stopFollowing();
}

void SensorService::followVehicle()
{
    m_settings->attach(&m_vehicleListener);
    if (BaseService::isConnected()) {
        rebuild();
    }
}

std::vector<std::shared_ptr<ParameterDescriptor>> SensorService::getDescriptors()
{
    std::lock_guard const lock(m_mutex);
    return m_set.descriptors(unitSystem());
}

std::vector<ParameterIdentifier::Id> SensorService::getSupportedIds()
{
    std::shared_ptr<IEcu> const current = ecu();
    return current != nullptr ? SensorSet::supportedIds(*current) : std::vector<ParameterIdentifier::Id>();
}

bool SensorService::isSupported(ParameterIdentifier::Id id)
{
    std::shared_ptr<IEcu> const current = ecu();
    bool const isByte = id >= 0 && id <= 0xFF;
    return current != nullptr && isByte &&
           current->isSupported(ObdMode::CurrentData, ParameterIdentifier(id).toOid(), 0);
}

std::shared_ptr<ParameterDataModel> SensorService::getParameter(ParameterIdentifier::Id id)
{
    std::shared_ptr<IEcu> const current = ecu();
    if (current == nullptr) {
        return nullptr;
    }
    std::shared_ptr<PowertrainParameter> const parameter =
        ParameterFactory().createParameter(*current, *m_settings, id);
    if (parameter == nullptr) {
        TERVEX_LOG(Error) << "No such parameter (" << static_cast<int>(id) << ")";
        return nullptr;
    }
    return describeParameter(parameter, current, unitSystem());
}

std::vector<std::shared_ptr<SensorDataModel>> SensorService::fetchSensors(ParameterIdentifier::Id id)
{
    return askSensors(id, false).value;
}

Outcome<std::vector<std::shared_ptr<SensorDataModel>>> SensorService::askSensors(ParameterIdentifier::Id id)
{
    return askSensors(id, true);
}

Outcome<std::vector<std::shared_ptr<SensorDataModel>>> SensorService::askSensors(ParameterIdentifier::Id id,
                                                                                 bool onlyOffered)
{
    std::shared_ptr<IEcu> const current = ecu();
    if (current == nullptr) {
        return Verdict{OutcomeKind::NotConnected};
    }
    std::shared_ptr<PowertrainParameter> const parameter =
        ParameterFactory().createParameter(*current, *m_settings, id);
    if (parameter == nullptr) {
        return Verdict{OutcomeKind::NotOffered};
    }
    std::optional<Needed> needed;
    if (onlyOffered && !isDerived(id)) {
        needed = Needed{ObdMode::CurrentData, ParameterIdentifier(id).toOid()};
    }
    return ask(*this, current, needed, parameter, [&] { return readSensors(parameter, current); });
}

std::vector<std::shared_ptr<SensorDataModel>>
SensorService::readSensors(std::shared_ptr<PowertrainParameter> const& parameter, std::shared_ptr<IEcu> const& current)
{
    UnitSystem const system = unitSystem();
    std::shared_ptr<ParameterDataModel> const description = describeParameter(parameter, current, system);
    auto const values = parameter->values(*current, system);
    for (std::size_t i = 0; i < description->sensors.size(); ++i) {
        SensorDataModel& sensor = *description->sensors[i];
        // By uid, not by position: a parameter leaves the sensors out that the reply told nothing of.
        if (std::shared_ptr<SensorValue> const value = findValue(values, sensor.uid)) {
            sensor.value = record(*current, value);
        } else {
            TERVEX_LOG(Error) << "No value for " << i << " (" << description->name << ")";
        }
    }
    return description->sensors;
}

// A module that is no longer the current one has no part in the statistics.
std::shared_ptr<SensorValueDataModel> SensorService::record(IEcu const& ecu, std::shared_ptr<SensorValue> const& value)
{
    std::lock_guard const lock(m_mutex);
    return m_set.ecu().get() == &ecu ? m_set.record(value) : SensorSet().record(value);
}

void SensorService::onServiceConnected()
{
    clear();
    rebuild();
}

void SensorService::onServiceDisconnected()
{
    clear();
}

void SensorService::onEcuChanged()
{
    clear();
    rebuild();
    notify(&ISensorServiceObserver::onInvalidated);
}

void SensorService::onUnitSystemChanged()
{
    {
        std::lock_guard const lock(m_mutex);
        m_set.restartStatistics();
    }
    notify(&ISensorServiceObserver::onInvalidated);
}

void SensorService::VehicleListener::onEvent(VelmoraSettingsEvent const& event)
{
    if (event != VelmoraSettingsEvent::UnitSystemChanged && event != VelmoraSettingsEvent::LanguageChanged) {
        m_service.onVehicleChanged();
    }
}

void SensorService::onVehicleChanged()
{
    clear();
    if (isConnected()) {
        rebuild();
    }
    notify(&ISensorServiceObserver::onInvalidated);
}

std::shared_ptr<SensorService::ParameterQuery> SensorService::find(ParameterIdentifier::Id id) const
{
    std::lock_guard const lock(m_mutex);
    return m_set.query(id);
}

void SensorService::clear()
{
    std::lock_guard const lock(m_mutex);
    m_set.cancelAll();
    m_set.clear();
}

void SensorService::rebuild()
{
    while (true) {
        std::shared_ptr<IEcu> const current = ecu();
        SensorSet fresh(current, *m_settings);
        std::lock_guard const lock(m_mutex);
        // Another module may have been selected meanwhile; whoever did that may have been here already.
        if (ecu() == current) {
            std::swap(m_set, fresh);
            return;
        }
    }
}

std::shared_ptr<ISensorService> SensorServiceBuilder::createSensorService()
{
    return buildService<SensorService>();
}

} // namespace obd
