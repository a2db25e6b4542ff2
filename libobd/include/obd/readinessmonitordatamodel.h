#pragma once

#include <string>

namespace obd {

/// A readiness monitor for the application; a copy that keeps nothing of the library alive.
struct ReadinessMonitorDataModel
{
    enum Status : int
    {
        Complete = 0,
        NotComplete = 1,
        DisabledThisCycle = 2, ///< of readiness in the present driving cycle only
        NotAvailable = 3,      ///< the vehicle has no such monitor
    };

    ReadinessMonitorDataModel(std::string const& monitorDescription, Status monitorStatus)
        : description(monitorDescription), status(monitorStatus)
    {}

    std::string description; // such as "Catalyst"
    Status status;
};

} // namespace obd
