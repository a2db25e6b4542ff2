#include "libobd/service/parametercatalogue.h"

#include "libobd/powertrain/batteryvoltage.h"
#include "libobd/powertrain/boostpressure.h"
#include "libobd/powertrain/consumptionchoice.h"
#include "libobd/powertrain/parametertables.h"
#include "libobd/powertrain/torque.h"
#include "libobd/service/sensormodels.h"

#include <obd/iecu.h>
#include <obd/parameterdescriptor.h>
#include <obd/parameterfactory.h>
#include <obd/powertrainparameter.h>
#include <obd/sensorpids.h>

namespace obd {

namespace {

using Parameters = std::vector<std::shared_ptr<PowertrainParameter>>;

constexpr unsigned int anyWeight = 1500;           // kg; no description depends on it
constexpr ConsumptionSettings anyVehicle{0, 0, 0}; // nor on these

// PID 0x02 exists in freeze frames only.
std::shared_ptr<PowertrainParameter> makeParameter(int pid)
{
    ParameterIdentifier::Id const id = ParameterIdentifier(pid).id();
    ParameterFactory factory;
    return pid == freezeFrameCodePid ? factory.createFreezeFrameParameter(id, 0) : factory.createParameter(id);
}

// Null among them for what there is no class for.
Parameters makeAllParameters(IEcu const& ecu)
{
    Parameters all;
    for (int pid = 0; pid <= lastListedPid; ++pid) {
        all.push_back(makeParameter(pid));
    }
    all.push_back(createConsumption(ecu, ecu.ignitionType(), anyVehicle));
    all.push_back(std::make_shared<BatteryVoltage>());
    all.push_back(std::make_shared<EnginePower>(anyWeight));
    all.push_back(std::make_shared<Torque>(anyWeight));
    all.push_back(std::make_shared<BoostPressure>());
    return all;
}

// A parameter with one sensor speaks for it; else each sensor's own name follows.
std::string displayName(std::string const& parameter, SensorDescriptor const& sensor, bool alone)
{
    return alone ? parameter : parameter + ": " + sensor.description();
}

std::vector<std::shared_ptr<ParameterDataModel>> describeAll(Parameters const& parameters,
                                                             std::shared_ptr<IEcu> const& ecu, UnitSystem system)
{
    std::vector<std::shared_ptr<ParameterDataModel>> models;
    for (std::shared_ptr<PowertrainParameter> const& parameter : parameters) {
        if (parameter != nullptr) {
            models.push_back(describeParameter(parameter, ecu, system));
        }
    }
    return models;
}

} // namespace

std::shared_ptr<ParameterDataModel> describeParameter(std::shared_ptr<PowertrainParameter> const& parameter,
                                                      std::shared_ptr<IEcu> const& ecu, UnitSystem system)
{
    ParameterDescriptor const descriptor(parameter, ecu, system);
    std::string const name = descriptor.description();
    auto const sensors = descriptor.sensors();
    std::vector<std::shared_ptr<SensorDataModel>> models;
    for (std::shared_ptr<SensorDescriptor> const& sensor : sensors) {
        models.push_back(makeLiveModel(*sensor, displayName(name, *sensor, sensors.size() == 1), nullptr));
    }
    return std::make_shared<ParameterDataModel>(descriptor.pid(), name, models);
}

std::vector<std::shared_ptr<ParameterDataModel>> describeAllParameters(std::shared_ptr<IEcu> const& ecu,
                                                                       UnitSystem system)
{
    return describeAll(makeAllParameters(*ecu), ecu, system);
}

std::vector<std::shared_ptr<ParameterDataModel>> describeFurtherParameters(std::shared_ptr<IEcu> const& ecu,
                                                                           UnitSystem system)
{
    Parameters further;
    for (int const pid : parameterPids()) {
        if (pid > lastListedPid) {
            further.push_back(makeParameter(pid));
        }
    }
    return describeAll(further, ecu, system);
}

} // namespace obd
