#pragma once

#include <obd/export.h>
#include <obd/vehicleprotocol.h>

#include <string>

namespace obd {

// A bus protocol with its name, for a list to choose from.
class ConnectionProtocol
{
public:
    explicit ConnectionProtocol(VehicleProtocol protocol) : m_protocol(protocol) {}

    VehicleProtocol protocol() const { return m_protocol; }
    // Such as "ISO 15765-4 CAN (11bit, 500kb)"; empty for a number outside the enumeration.
    OBD_EXPORT std::string description() const;

private:
    VehicleProtocol m_protocol;
};

} // namespace obd
