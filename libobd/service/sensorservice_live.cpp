// The updates that go on until they are ended.

#include "libobd/service/sensorservice.h"

#include <obd/iecu.h>
#include <obd/parameterdescriptor.h>
#include <obd/powertrainparameter.h>

namespace obd {

void SensorService::updateOnce(std::vector<ParameterIdentifier::Id> const& ids)
{
    startUpdates(ids);
    m_singleShot = true;
}

void SensorService::startUpdates(std::vector<ParameterIdentifier::Id> const& ids)
{
    m_singleShot = false;
    for (ParameterIdentifier::Id const id : ids) {
        if (std::shared_ptr<ParameterQuery> const query = find(id)) {
            update(query);
        }
    }
}

void SensorService::reset()
{
    clear();
    rebuild();
}

void SensorService::update(std::shared_ptr<ParameterQuery> const& query)
{
    // The query does not hold itself: once the set lets go of it, it is gone.
    std::weak_ptr<ParameterQuery> const finished = query;
    query->start([this, finished](bool success, std::shared_ptr<PowertrainParameter> const& parameter) {
        onQueryFinished(success, finished, parameter);
    });
}

void SensorService::onQueryFinished(bool success, std::weak_ptr<ParameterQuery> const& finished,
                                    std::shared_ptr<PowertrainParameter> const& parameter)
{
    std::shared_ptr<ParameterQuery> const query = finished.lock();
    if (query == nullptr) {
        return;
    }
    std::weak_ptr<bool> const alive = m_alive;
    if (success) {
        publish(*query, parameter);
    }
    if (alive.expired()) {
        return; // an observer let go of the service
    }
    // An observer, or another thread, may have put a new set in place of the query's.
    if (!m_singleShot && find(parameter->pid()) == query) {
        update(query);
    }
}

void SensorService::publish(ParameterQuery const& query, std::shared_ptr<PowertrainParameter> const& parameter)
{
    std::shared_ptr<ParameterDescriptor> descriptor;
    SensorSet::Models models;
    {
        std::lock_guard const lock(m_mutex);
        // The worker is told of a success also where other modules alone delivered.
        if (m_set.query(parameter->pid()).get() != &query || !parameter->delivered(*m_set.ecu())) {
            return;
        }
        // Units and statistics belong together, so both are settled under the lock.
        UnitSystem const system = unitSystem();
        models = m_set.record(parameter->values(*m_set.ecu(), system));
        descriptor = std::make_shared<ParameterDescriptor>(parameter, m_set.ecu(), system);
    }
    notify(&ISensorServiceObserver::onSensorUpdated, true, descriptor, models);
}

} // namespace obd
