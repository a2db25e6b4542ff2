#pragma once

#include <obd/export.h>
#include <obd/obdmode.h>
#include <obd/parameteridentifier.h>

#include <memory>

namespace obd {

class PowertrainParameter;

// Makes the class of a parameter from its identifier. Safe from any thread. Which identifiers have a class is fixed at
// compile time.
class OBD_EXPORT ParameterFactory
{
public:
    virtual ~ParameterFactory() = default;

    // For a live reading. Null for an identifier without a class, and for the fuel consumption, which comes from
    // createConsumption. The engine's power and torque are made for a usual weight of the vehicle, with a log line: who
    // knows the weight makes these classes itself.
    std::shared_ptr<PowertrainParameter> createParameter(ParameterIdentifier::Id id);

    // For a reading from a freeze frame. Null for an identifier without a class, or of one that no freeze frame holds.
    std::shared_ptr<PowertrainParameter> createFreezeFrameParameter(ParameterIdentifier::Id id, unsigned char frame);
};

} // namespace obd
