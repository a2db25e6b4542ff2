#pragma once

#include <obd/export.h>
#include <obd/iecu.h>
#include <obd/parameteridentifier.h>

#include <cstddef>
#include <memory>
#include <optional>

namespace obd {

class IVelmoraSettings;
class PowertrainParameter;

/// Makes the class of a parameter from its identifier, for who asks the vehicle without the services. Safe from any
/// thread. Which identifiers have a class is fixed at compile time.
class OBD_EXPORT ParameterFactory
{
public:
    virtual ~ParameterFactory() = default;

    /// For a live reading. Null for an identifier without a class, and for the fuel consumption, which depends on the
    /// module. The engine's power and torque are made for a usual weight of the vehicle, with a log line.
    std::shared_ptr<PowertrainParameter> createParameter(ParameterIdentifier::Id id);

    /// For a reading from a freeze frame. Null for an identifier without a class, or of one that no freeze frame holds.
    std::shared_ptr<PowertrainParameter> createFreezeFrameParameter(ParameterIdentifier::Id id, unsigned char frame);

    /// For a live reading of this module in this vehicle: what is worked out takes ignition type, displacement,
    /// efficiency, correction and weight from the settings, which are asked once, here. Whether the module reports the
    /// parameter is not asked, save for the fuel consumption: null if none of its models suits the module. Null for an
    /// identifier without a class.
    std::shared_ptr<PowertrainParameter> createParameter(IEcu const& ecu, IVelmoraSettings const& settings,
                                                         ParameterIdentifier::Id id);

    /// How many bytes of data stand behind a PID of service 01 or 02 in a module's reply, as SAE J1979 has it: the
    /// support masks and the PIDs that are no sensors among them. Nothing for a PID of which the library does not know
    /// it, and for the library's own identifiers. That of a fuel trim grows from 1 to 2 with the connection to a
    /// vehicle of four banks.
    static std::optional<std::size_t> dataLength(ParameterIdentifier::Id id);
};

} // namespace obd
