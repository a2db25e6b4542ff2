#pragma once

#include "simulator/car/module.h"

#include <deque>

namespace obdsim {

/// One message of one module, before the bus cuts it into frames.
struct ModuleMessage
{
    std::uint32_t source = 0;
    Time delay{}; ///< from the end of the request
    Bytes payload;
    std::optional<Time> frameGap = {};       ///< of the module, where it has one of its own
    std::optional<std::uint8_t> tester = {}; ///< first byte of its frames, with an extended address
};

/// A car: its control modules on one bus.
class Vehicle
{
public:
    explicit Vehicle(VehicleData const& data);
    Vehicle(Vehicle const&) = delete;
    Vehicle& operator=(Vehicle const&) = delete;

    std::string const& name() const;
    Protocol const& protocol() const;
    Padding padding() const;

    /// Voltage at the diagnostic socket.
    double volts(Time now) const;

    /// What it waits at the end of a 5 baud initialisation, before it returns its address inverted (W4 of ISO 9141-2).
    Time addressPause() const { return m_addressPause; }

    /// Anything on the bus: the ignition is on and there is a module.
    bool isAwake() const;

    bool ignition() const;
    void setIgnition(bool on);

    /// A voltage of one's own at the socket; nothing gives it back.
    void setVolts(std::optional<double> volts);

    Drive& drive();
    std::deque<Module>& modules();

    /// Null if there is none of that id.
    Module* findModule(std::uint32_t id);

    /// What the modules say to a request, in the order of time.
    std::vector<ModuleMessage> request(Target const& target, Bytes const& payload, Time now);

private:
    std::string m_name;
    Protocol const& m_protocol;
    Padding m_padding;
    Time m_addressPause;
    std::optional<double> m_volts;
    std::optional<double> m_chosenVolts;
    Drive m_drive;
    std::deque<Module> m_modules;
    bool m_ignition = true;
};

} // namespace obdsim
