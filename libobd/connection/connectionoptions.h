#pragma once

#include "libobd/connection/rememberedbluetoothdevices.h"

#include <common/eventproducer.h>
#include <obd/iconnectionoptions.h>
#include <obd/isettings.h>

#include <memory>
#include <vector>

namespace obd {

// The connection options on top of the application's store.
class ConnectionOptions : public IConnectionOptions, public tervex::EventProducer<ConnectionOptionsEvent>
{
public:
    // Loads the options and the remembered devices. settings must not be null.
    explicit ConnectionOptions(std::shared_ptr<ISettings> const& settings);

    void save() override;
    void load() override;

    int bus() const override { return m_bus; }
    void setBus(int bus) override;
    VehicleProtocol protocol() const override { return m_protocol; }
    void setProtocol(VehicleProtocol protocol) override;
    BluetoothDescriptor bluetoothDescriptor() const override { return m_bluetooth; }
    void setBluetoothDescriptor(BluetoothDescriptor const& descriptor) override;
    SerialDescriptor serialDescriptor() const override { return m_serial; }
    void setSerialDescriptor(SerialDescriptor const& descriptor) override;
    TcpDescriptor tcpDescriptor() const override { return m_tcp; }
    void setTcpDescriptor(TcpDescriptor const& descriptor) override;
    void addBluetoothDevice(BluetoothDescriptor const& device) override;
    void bluetoothDevices(std::vector<BluetoothDescriptor>& devices) const override;

private:
    BluetoothDescriptor readBluetooth() const;
    SerialDescriptor readSerial() const;
    TcpDescriptor readTcp() const;

    std::shared_ptr<ISettings> m_settings;
    RememberedBluetoothDevices m_remembered;
    int m_bus = 0;
    VehicleProtocol m_protocol = VehicleProtocol::Automatic;
    BluetoothDescriptor m_bluetooth;
    SerialDescriptor m_serial;
    TcpDescriptor m_tcp;
};

} // namespace obd
