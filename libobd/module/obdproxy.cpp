#include "libobd/module/obdproxy.h"

#include "libobd/bytes/bytes.h"
#include "libobd/module/ecu.h"
#include "libobd/parameters/supportedoids.h"

#include <common/logrecord.h>
#include <common/tracestream.h>

#include <utility>

namespace obd {

std::shared_ptr<IObdProxy> ObdProxyBuilder::createObdProxy()
{
    return std::make_shared<ObdProxy>();
}

void ObdProxy::setDevice(std::shared_ptr<IDevice> device)
{
    std::unique_lock const lock(m_mutex);
    m_device = std::move(device);
}

bool ObdProxy::initialize()
{
    releaseEcus();
    if (!discoverEcus()) {
        return false;
    }
    std::vector<std::shared_ptr<Ecu>> const found = ecuList();
    if (found.empty() || !found.front()->init(0)) {
        return false;
    }
    for (unsigned int i = 1; i < found.size(); ++i) {
        found[i]->init(i);
    }
    return isConnected();
}

// The discovery is the first request of a connection. What a module answers is not looked at: a refusal shows it, too.
bool ObdProxy::discoverEcus()
{
    Service01Oids const query(0);
    std::vector<unsigned char> request;
    query.requestData(request);
    ResponseMap responses;
    IDevice::Status const status = execute(request, responses, query.timeout());
    if (status != IDevice::Status::Ok) {
        TERVEX_LOG(Fatal) << "Failed to detect ECUs, invalid status " << static_cast<int>(status);
        return false;
    }
    if (responses.empty()) {
        TERVEX_LOG(Fatal) << "Failed to detect ECUs, empty response";
        return false;
    }
    std::shared_lock const lock(m_mutex);
    if (!deviceEnabled()) {
        TERVEX_LOG(Fatal) << "Failed to detect ECUs, device not enabled";
        return false;
    }
    ObdProtocol const protocol = m_device->getProtocol();
    std::string const description = m_device->getProtocolDescription();
    std::lock_guard const listLock(m_ecusMutex);
    for (auto const& entry : responses) {
        tervex::TraceStream << "Found ECU: 0x" << lowerHex(entry.first) << " with protocol "
                            << static_cast<int>(protocol);
        m_ecus.push_back(std::make_shared<Ecu>(entry.first, protocol, description, shared_from_this()));
    }
    return true;
}

bool ObdProxy::deviceEnabled() const
{
    return m_device != nullptr && m_device->isEnabled();
}

bool ObdProxy::isConnected()
{
    std::shared_lock const lock(m_mutex);
    return deviceEnabled();
}

ObdProtocol ObdProxy::protocol()
{
    std::shared_lock const lock(m_mutex);
    return deviceEnabled() ? m_device->getProtocol() : ObdProtocolUnknown;
}

std::vector<std::shared_ptr<Ecu>> ObdProxy::ecuList() const
{
    std::lock_guard const lock(m_ecusMutex);
    return m_ecus;
}

std::vector<std::shared_ptr<IEcu>> ObdProxy::ecus()
{
    std::vector<std::shared_ptr<Ecu>> const list = ecuList();
    return {list.begin(), list.end()};
}

std::shared_ptr<IEcu> ObdProxy::firstEcu()
{
    std::lock_guard const lock(m_ecusMutex);
    return m_ecus.empty() ? nullptr : m_ecus.front();
}

std::shared_ptr<IEcu> ObdProxy::ecu(unsigned int id)
{
    std::lock_guard const lock(m_ecusMutex);
    for (std::shared_ptr<Ecu> const& candidate : m_ecus) {
        if (candidate->id() == id) {
            return candidate;
        }
    }
    return nullptr;
}

VehicleProtocol ObdProxy::vehicleProtocol()
{
    std::shared_lock const lock(m_mutex);
    return deviceEnabled() ? m_device->vehicleProtocol() : VehicleProtocol::Automatic;
}

template <typename Request, typename Reply>
IDevice::Status ObdProxy::exchange(Request const& request, Reply& reply, unsigned int timeoutMs, AdapterNote& note)
{
    std::unique_lock const lock(m_mutex);
    note = AdapterNote::None;
    if (!deviceEnabled()) {
        return IDevice::Status::Unparsed;
    }
    IDevice::Status const status = m_device->execute(request, reply, timeoutMs);
    note = m_device->lastNote();
    return status;
}

IDevice::Status ObdProxy::execute(std::string const& command, std::string& response, unsigned int timeoutMs)
{
    AdapterNote note{};
    return exchange(command, response, timeoutMs, note);
}

IDevice::Status ObdProxy::execute(std::vector<unsigned char> const& request, ResponseMap& responses,
                                  unsigned int timeoutMs)
{
    AdapterNote note{};
    return exchange(request, responses, timeoutMs, note);
}

IDevice::Status ObdProxy::executeNoted(std::string const& command, std::string& response, unsigned int timeoutMs,
                                       AdapterNote& note)
{
    return exchange(command, response, timeoutMs, note);
}

IDevice::Status ObdProxy::executeNoted(std::vector<unsigned char> const& request, ResponseMap& responses,
                                       unsigned int timeoutMs, AdapterNote& note)
{
    return exchange(request, responses, timeoutMs, note);
}

float ObdProxy::batteryVoltage()
{
    std::unique_lock const lock(m_mutex);
    float volts = 0.0F;
    if (!deviceEnabled()) {
        return volts;
    }
    if (!m_device->batteryVoltage(volts) || !(volts > 0.0F)) {
        TERVEX_LOG(Error) << "Failed to get battery voltage";
    }
    return volts;
}

void ObdProxy::releaseEcus()
{
    std::vector<std::shared_ptr<Ecu>> released; // dies after the lock is given up
    std::lock_guard const lock(m_ecusMutex);
    released.swap(m_ecus);
}

} // namespace obd
