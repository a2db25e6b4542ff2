#pragma once

#include <obd/iadapter.h>
#include <obd/responsemap.h>
#include <obd/vehicleprotocol.h>

#include <string>
#include <vector>

namespace obd {

/// What the adapter said where no usable reply came.
enum class AdapterNote : int
{
    None = 0,          ///< nothing, or words that tell of silence on the bus, such as "NO DATA"
    ReplyLost = 1,     ///< words for a reply that came damaged or was cut off: "DATA ERROR", "BUFFER FULL", "STOPPED"
    NotUnderstood = 2, ///< "?": it does not know the command
};

/// The scan tool driver as the message layer sees it. One thread at a time may talk through it.
class IDevice : public IAdapter
{
public:
    /// How an exchange went.
    enum class Status : int
    {
        Ok = 0,         ///< the reply was obtained (and, for bytes, parsed)
        NotSent = 1,    ///< device disabled or connection dead
        NotEnabled = 2, ///< no usable reply, and no vehicle link stands
        NoResponse = 3, ///< no usable reply on a standing link: timeout, or the adapter's error word
        Unparsed = 4,   ///< a reply came, but no control module's payload could be made of it
    };

    /// Identifies the adapter and puts it into the state that the driver relies on. Takes some seconds.
    virtual bool initialize() = 0;

    /// Sets the protocol up and proves that a control module answers; Automatic searches, which may take minutes.
    virtual bool detectVehicle(VehicleProtocol protocol) = 0;

    /// Sends the adapter to sleep and gives the channel up.
    virtual void close() = 0;

    /// True while a vehicle link stands.
    virtual bool isEnabled() const = 0;

    /// The raw console: one command, one reply as the adapter wrote it, line ends removed.
    virtual Status execute(std::string const& command, std::string& response, unsigned int timeoutMs) = 0;

    /// One OBD request; the replies of all control modules are added to responses.
    virtual Status execute(std::vector<unsigned char> const& payload, ResponseMap& responses,
                           unsigned int timeoutMs) = 0;

    /// Narrows what the adapter lets through to one CAN identifier. Not undone by the driver.
    virtual bool activateEcu(unsigned int ecu) = 0;

    /// The adapter's number of the protocol in use; Automatic while none is known, or by a driver that does not tell
    /// it.
    virtual VehicleProtocol vehicleProtocol() { return VehicleProtocol::Automatic; }

    /// Of the last execute, where its status is NoResponse or NotEnabled. The thread that talks through the device.
    virtual AdapterNote lastNote() { return AdapterNote::None; }
};

} // namespace obd
