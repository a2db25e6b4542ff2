#pragma once

#include "simulator/car/module.h"

namespace obdsim {

/// One message of one module, before the bus cuts it into frames.
struct ModuleMessage
{
    std::uint32_t source = 0;
    Time delay{}; ///< from the end of the request
    Bytes payload;
    std::optional<Time> frameGap = {}; ///< of the module, where it has one of its own
};

/// A car: its control modules on one bus.
class Vehicle
{
public:
    explicit Vehicle(VehicleData const& data);

    std::string const& name() const;
    Protocol const& protocol() const;
    Padding padding() const;

    /// Voltage at the diagnostic socket.
    double volts(Time now) const;

    /// What the modules say to a request, in the order of time.
    std::vector<ModuleMessage> request(Target const& target, Bytes const& payload, Time now);

private:
    std::string m_name;
    Protocol const& m_protocol;
    Padding m_padding;
    std::optional<double> m_volts;
    DriveModel m_drive;
    std::vector<Module> m_modules;
};

} // namespace obdsim
