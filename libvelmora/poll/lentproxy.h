#pragma once

#include "libvelmora/poll/pollwire.h"

#include <obd/iobdproxy.h>

#include <map>
#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace velmora {

// The proxy that one parameter of one control module is given: answers a request from what was fetched for it, and asks
// the vehicle for anything else. Only this module is to be seen through it, so that a derived value is fed with the
// readings of its own module and no other.
class LentProxy : public obd::IObdProxy
{
public:
    // wire must outlive it.
    LentProxy(PollWire& wire, std::shared_ptr<obd::IEcu> ecu) : m_wire(wire), m_ecu(std::move(ecu)) {}

    // Begins a run, with nothing lent and nothing asked.
    void begin();
    // The module's reply to the request for one PID of service 01; an empty one says that the module did not answer.
    void lend(unsigned char pid, std::vector<unsigned char> const& payload) { m_lent[pid] = payload; }
    // The PIDs of service 01 that were asked for in this run.
    std::set<unsigned char> const& asked() const { return m_asked; }

    void setDevice(std::shared_ptr<obd::IDevice> /*device*/) override {}
    bool initialize() override { return false; }
    bool isConnected() override { return m_wire.proxy().isConnected(); }
    obd::ObdProtocol protocol() override { return m_wire.proxy().protocol(); }
    std::vector<std::shared_ptr<obd::IEcu>> ecus() override { return {m_ecu}; }
    std::shared_ptr<obd::IEcu> firstEcu() override { return m_ecu; }
    std::shared_ptr<obd::IEcu> ecu(unsigned int id) override { return id == m_ecu->id() ? m_ecu : nullptr; }
    obd::IDevice::Status execute(std::string const& command, std::string& response, unsigned int timeoutMs) override;
    obd::IDevice::Status execute(std::vector<unsigned char> const& request, obd::ResponseMap& responses,
                                 unsigned int timeoutMs) override;
    float batteryVoltage() override { return m_wire.proxy().batteryVoltage(); }
    obd::VehicleProtocol vehicleProtocol() override { return m_wire.proxy().vehicleProtocol(); }

private:
    PollWire& m_wire;
    std::shared_ptr<obd::IEcu> const m_ecu;
    std::map<unsigned char, std::vector<unsigned char>> m_lent;
    std::set<unsigned char> m_asked;
};

} // namespace velmora
