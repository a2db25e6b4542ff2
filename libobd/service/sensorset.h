#pragma once

#include "libobd/dispatch/query.h"
#include "libobd/service/sensordata.h"

#include <obd/parameteridentifier.h>
#include <obd/unitsystem.h>

#include <map>
#include <memory>
#include <vector>

namespace obd {

class IEcu;
class IVelmoraSettings;
class ParameterDescriptor;
class PowertrainParameter;
class SensorValue;
struct SensorValueDataModel;

// All that can be read live from one control module: the parameters, the query of each, and the record of each sensor.
// Not guarded.
class SensorSet
{
public:
    using ParameterQuery = Query<PowertrainParameter>;
    using Models = std::vector<std::shared_ptr<SensorValueDataModel>>;

    // Of no module.
    SensorSet() = default;
    // ecu may be null. Asks the application's settings store.
    SensorSet(std::shared_ptr<IEcu> ecu, IVelmoraSettings const& settings);

    // The PIDs that a module reports, without the support masks and those that are no sensors.
    static std::vector<ParameterIdentifier::Id> supportedIds(IEcu const& ecu);

    std::shared_ptr<IEcu> const& ecu() const { return m_ecu; }
    std::vector<std::shared_ptr<ParameterDescriptor>> descriptors(UnitSystem system) const;
    // Null if the set has no such parameter.
    std::shared_ptr<ParameterQuery> query(ParameterIdentifier::Id id) const;

    // Takes readings into the records of their sensors. A reading of a sensor that is not in the set is left out.
    Models record(std::vector<std::shared_ptr<SensorValue>> const& values);
    // The one of a single reading, which for a sensor that is not in the set is the plain reading.
    std::shared_ptr<SensorValueDataModel> record(std::shared_ptr<SensorValue> const& value);

    void cancelAll();
    void clear();
    // Makes the records anew.
    void restartStatistics();

private:
    void add(std::shared_ptr<PowertrainParameter> const& parameter);

    std::shared_ptr<IEcu> m_ecu;
    std::map<ParameterIdentifier::Id, std::shared_ptr<PowertrainParameter>> m_parameters;
    std::map<ParameterIdentifier::Id, std::shared_ptr<ParameterQuery>> m_queries; // one for each of m_parameters
    std::map<int, std::shared_ptr<SensorData>> m_sensorData;                      // by the sensor's uid
};

} // namespace obd
