#pragma once

#include <obd/connectiondescriptors.h>
#include <obd/vehicleprotocol.h>
#include <tervex/ieventproducer.h>

#include <vector>

namespace obd {

/// Which connection option was set. Fired also when the value is the same as before.
enum class ConnectionOptionsEvent : int
{
    BusChanged = 1,
    ProtocolChanged = 2,
    BluetoothDescriptorChanged = 3,
    SerialDescriptorChanged = 4,
    TcpDescriptorChanged = 5,
};

/// How the application reaches its adapter. The library stores these for the application and acts on none of them. A
/// copy in memory: setters change the copy and fire their event, save alone writes it. No lock: one thread at a time.
class IConnectionOptions
    : public virtual tervex::IEventProducer<ConnectionOptionsEvent, tervex::IEventListener<ConnectionOptionsEvent>>
{
public:
    /// Writes the copy to the application's store.
    virtual void save() = 0;
    /// Reads the copy afresh, dropping what was not saved. Values out of range and incomplete descriptors read as their
    /// defaults. Fires nothing.
    virtual void load() = 0;

    /// The kind of channel, 0, 1 or 2, whose meaning is the application's. Not checked when set; cut to the range when
    /// loaded.
    virtual int bus() const = 0;
    virtual void setBus(int bus) = 0; ///< fires BusChanged

    virtual VehicleProtocol protocol() const = 0;           ///< default automatic
    virtual void setProtocol(VehicleProtocol protocol) = 0; ///< fires ProtocolChanged

    virtual BluetoothDescriptor bluetoothDescriptor() const = 0; ///< the one to use
    /// Fires BluetoothDescriptorChanged.
    virtual void setBluetoothDescriptor(BluetoothDescriptor const& descriptor) = 0;

    virtual SerialDescriptor serialDescriptor() const = 0;                    ///< the one to use
    virtual void setSerialDescriptor(SerialDescriptor const& descriptor) = 0; ///< fires SerialDescriptorChanged

    virtual TcpDescriptor tcpDescriptor() const = 0;                    ///< the one to use
    virtual void setTcpDescriptor(TcpDescriptor const& descriptor) = 0; ///< fires TcpDescriptorChanged

    /// Remembers a device, known by its address, and writes the list to the store at once. One that is known under
    /// another name moves to the end with the new name; one that is known as it stands changes nothing. Fires nothing.
    virtual void addBluetoothDevice(BluetoothDescriptor const& device) = 0;
    /// The remembered devices, the latest last. Replaces what the vector held.
    virtual void bluetoothDevices(std::vector<BluetoothDescriptor>& devices) const = 0;
};

} // namespace obd
