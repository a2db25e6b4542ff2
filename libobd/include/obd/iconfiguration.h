#pragma once

#include <obd/connectionprotocol.h>

#include <vector>

namespace obd {

/// What may be chosen for a connection.
class IConfiguration
{
public:
    virtual ~IConfiguration() = default;

    /// Line rates in baud. These two replace what the vector held.
    virtual void supportedBaudrates(std::vector<int>& baudrates) const = 0;
    virtual void supportedInitialBaudrates(std::vector<int>& baudrates) const = 0; ///< those an adapter may start with

    /// These two append to the vector.
    virtual void supportedProtocols(std::vector<ConnectionProtocol>& protocols) const = 0;
    virtual void supportedBuses(std::vector<int>& buses) const = 0; ///< for IConnectionOptions::setBus
};

} // namespace obd
