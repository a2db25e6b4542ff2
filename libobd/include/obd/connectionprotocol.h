#pragma once

#include <obd/export.h>
#include <obd/obdprotocol.h>
#include <obd/vehicleprotocol.h>

#include <string>

namespace obd {

/// A bus protocol to choose, with its name for people.
class OBD_EXPORT ConnectionProtocol
{
public:
    /// Any number is taken; one that no protocol has has no description.
    explicit ConnectionProtocol(VehicleProtocol protocol);

    VehicleProtocol protocol() const; ///< as it was given
    /// Such as "ISO 9141-2"; empty for a number that no protocol has.
    std::string description() const;

private:
    VehicleProtocol m_protocol;
};

/// The bus family of a protocol; ObdProtocolUnknown for Automatic and for a number that no protocol has.
OBD_EXPORT ObdProtocol toObdProtocol(VehicleProtocol protocol);

} // namespace obd
