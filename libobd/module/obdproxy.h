#pragma once

#include <obd/iobdproxy.h>

#include <memory>
#include <mutex>
#include <shared_mutex>
#include <vector>

namespace obd {

class Ecu;

class ObdProxy : public IObdProxy, public std::enable_shared_from_this<ObdProxy>
{
public:
    void setDevice(std::shared_ptr<IDevice> device) override;
    bool initialize() override;
    bool isConnected() override;
    ObdProtocol protocol() override;
    std::vector<std::shared_ptr<IEcu>> ecus() override;
    std::shared_ptr<IEcu> firstEcu() override;
    std::shared_ptr<IEcu> ecu(unsigned int id) override;
    IDevice::Status execute(std::string const& command, std::string& response, unsigned int timeoutMs) override;
    IDevice::Status execute(std::vector<unsigned char> const& request, ResponseMap& responses,
                            unsigned int timeoutMs) override;
    float batteryVoltage() override;
    VehicleProtocol vehicleProtocol() override;
    IDevice::Status executeNoted(std::string const& command, std::string& response, unsigned int timeoutMs,
                                 AdapterNote& note) override;
    IDevice::Status executeNoted(std::vector<unsigned char> const& request, ResponseMap& responses,
                                 unsigned int timeoutMs, AdapterNote& note) override;

    // Drops the control modules. They and the proxy hold each other, so the owner of the proxy calls this when it lets
    // the proxy go.
    void releaseEcus();

private:
    bool discoverEcus();
    template <typename Request, typename Reply>
    IDevice::Status exchange(Request const& request, Reply& reply, unsigned int timeoutMs, AdapterNote& note);
    // Called with m_mutex held.
    bool deviceEnabled() const;
    std::vector<std::shared_ptr<Ecu>> ecuList() const;

    // Guards the device and all use of it: one exchange at a time.
    std::shared_mutex m_mutex;
    std::shared_ptr<IDevice> m_device;

    // A leaf: never held over a call out.
    mutable std::mutex m_ecusMutex;
    std::vector<std::shared_ptr<Ecu>> m_ecus; // in rising order of id
};

namespace ObdProxyBuilder {
// A proxy without a device and without control modules.
std::shared_ptr<IObdProxy> createObdProxy();
} // namespace ObdProxyBuilder

} // namespace obd
