#pragma once

#include <obd/iobdproxy.h>

#include <map>
#include <memory>
#include <span>
#include <utility>
#include <vector>

namespace velmora {

// A proxy that answers requests for PIDs of service 01 from what was fetched for them together (ISO 15765-4: up to six
// in one request), as if each had been asked for alone; anything else is asked of the vehicle. For one control module,
// and for as long as a value may be old.
class GroupedPids : public obd::IObdProxy
{
public:
    GroupedPids(std::shared_ptr<obd::IObdProxy> proxy, unsigned int module)
        : m_proxy(std::move(proxy)), m_module(module)
    {}

    // Forgets what was fetched, and fetches these. What the bus, the adapter or the module does not do stays to be
    // asked alone: a reply that does not divide exactly is dropped whole, and there is no second try.
    void fetch(std::span<unsigned char const> pids);

    void setDevice(std::shared_ptr<obd::IDevice> device) override { m_proxy->setDevice(std::move(device)); }
    bool initialize() override { return m_proxy->initialize(); }
    bool isConnected() override { return m_proxy->isConnected(); }
    obd::ObdProtocol protocol() override { return m_proxy->protocol(); }
    std::vector<std::shared_ptr<obd::IEcu>> ecus() override { return m_proxy->ecus(); }
    std::shared_ptr<obd::IEcu> firstEcu() override { return m_proxy->firstEcu(); }
    std::shared_ptr<obd::IEcu> ecu(unsigned int id) override { return m_proxy->ecu(id); }
    obd::IDevice::Status execute(std::string const& command, std::string& response, unsigned int timeoutMs) override
    {
        return m_proxy->execute(command, response, timeoutMs);
    }
    obd::IDevice::Status execute(std::vector<unsigned char> const& request, obd::ResponseMap& responses,
                                 unsigned int timeoutMs) override;
    obd::IDevice::Status executeNoted(std::string const& command, std::string& response, unsigned int timeoutMs,
                                      obd::AdapterNote& note) override
    {
        return m_proxy->executeNoted(command, response, timeoutMs, note);
    }
    obd::IDevice::Status executeNoted(std::vector<unsigned char> const& request, obd::ResponseMap& responses,
                                      unsigned int timeoutMs, obd::AdapterNote& note) override;
    float batteryVoltage() override { return m_proxy->batteryVoltage(); }
    obd::VehicleProtocol vehicleProtocol() override { return m_proxy->vehicleProtocol(); }

private:
    // What was fetched for a request, or null.
    std::vector<unsigned char> const* known(std::vector<unsigned char> const& request) const;
    bool fetchGroup(std::vector<unsigned char> const& pids);

    std::shared_ptr<obd::IObdProxy> const m_proxy;
    unsigned int const m_module;
    bool m_alone = false; // PIDs together proved to be no way here
    std::map<unsigned char, std::vector<unsigned char>> m_replies;
};

} // namespace velmora
