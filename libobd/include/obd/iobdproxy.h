#pragma once

#include <obd/idevice.h>
#include <obd/iecu.h>
#include <obd/responsemap.h>

#include <memory>
#include <string>
#include <vector>

namespace obd {

/// The one door from queries to the adapter. Safe from any thread: one exchange at a time is in flight, the others
/// wait. Must not be called from a connection logger.
class IObdProxy
{
public:
    virtual ~IObdProxy() = default;

    /// Replaces the device; the control modules found stay until the next initialize.
    virtual void setDevice(std::shared_ptr<IDevice> device) = 0;

    /// Finds the control modules that answer and reads what they support. Takes seconds to minutes on a slow bus. False
    /// if none answers, if the first one tells nothing, or if the link is lost meanwhile.
    virtual bool initialize() = 0;

    /// Whether a vehicle link stands. Waits for a running exchange.
    virtual bool isConnected() = 0;
    virtual ObdProtocol protocol() = 0; ///< the bus family

    /// The control modules found, in rising order of id; they stay after the link is lost.
    virtual std::vector<std::shared_ptr<IEcu>> ecus() = 0;
    virtual std::shared_ptr<IEcu> firstEcu() = 0; ///< null if none was found
    /// Null for an unknown id.
    virtual std::shared_ptr<IEcu> ecu(unsigned int id) = 0;

    /// As in IDevice; Unparsed while no device with a vehicle link is set.
    virtual IDevice::Status execute(std::string const& command, std::string& response, unsigned int timeoutMs) = 0;
    /// One request; what the control modules reply is added to responses.
    virtual IDevice::Status execute(std::vector<unsigned char> const& request, ResponseMap& responses,
                                    unsigned int timeoutMs) = 0;

    /// Supply voltage in volts by the adapter, 0.0 if it can't be read.
    virtual float batteryVoltage() = 0;

    /// The adapter's number of the protocol in use; Automatic while no vehicle link stands, or by a device that does
    /// not tell it.
    virtual VehicleProtocol vehicleProtocol() { return VehicleProtocol::Automatic; }

    /// execute, and in the same exchange what the adapter said where no usable reply came.
    virtual IDevice::Status executeNoted(std::string const& command, std::string& response, unsigned int timeoutMs,
                                         AdapterNote& note)
    {
        note = AdapterNote::None;
        return execute(command, response, timeoutMs);
    }
    /// The same of a request.
    virtual IDevice::Status executeNoted(std::vector<unsigned char> const& request, ResponseMap& responses,
                                         unsigned int timeoutMs, AdapterNote& note)
    {
        note = AdapterNote::None;
        return execute(request, responses, timeoutMs);
    }
};

} // namespace obd
