#include "libobd/connection/connectionoptions.h"

#include "libobd/connection/settingskeys.h"

#include <string>

namespace obd {
namespace {

// Where the access point inside a Wi-Fi adapter is usually found.
constexpr char const* wifiAdapterAddress = "192.168.0.10";
constexpr int wifiAdapterPort = 35000;

} // namespace

ConnectionOptions::ConnectionOptions(std::shared_ptr<ISettings> const& settings)
    : m_settings(settings), m_remembered(settings), m_bluetooth("", "", 1), m_serial("", ""), m_tcp("", 0)
{
    ConnectionOptions::load();
    m_remembered.load();
}

void ConnectionOptions::load()
{
    m_bus = settings::readInt(*m_settings, settings::bus);
    m_protocol = static_cast<VehicleProtocol>(settings::readInt(*m_settings, settings::protocol));
    m_bluetooth = readBluetooth();
    m_serial = readSerial();
    m_tcp = readTcp();
}

BluetoothDescriptor ConnectionOptions::readBluetooth() const
{
    std::string name;
    std::string address;
    int port = 0;
    if (m_settings->getString(settings::bluetoothName, name) &&
        m_settings->getString(settings::bluetoothAddress, address) &&
        m_settings->getInt(settings::bluetoothPort, port)) {
        return {name, address, port};
    }
    return {"", "", 1};
}

// A stored line rate counts only where it was chosen by hand.
SerialDescriptor ConnectionOptions::readSerial() const
{
    std::string device;
    int automatic = 0;
    if (!m_settings->getString(settings::serialDevice, device) ||
        !m_settings->getInt(settings::serialAutoBaudrate, automatic)) {
        return {"", ""};
    }
    std::string description;
    m_settings->getString(settings::serialDescription, description);
    if (automatic != 0) {
        return {device, description};
    }
    return {device, settings::readInt(*m_settings, settings::serialBaudrate),
            settings::readInt(*m_settings, settings::serialInitialBaudrate), description};
}

TcpDescriptor ConnectionOptions::readTcp() const
{
    std::string address;
    int port = 0;
    if (m_settings->getString(settings::tcpAddress, address) && m_settings->getInt(settings::tcpPort, port)) {
        return {address, port};
    }
    return {wifiAdapterAddress, wifiAdapterPort};
}

void ConnectionOptions::save()
{
    m_settings->setInt(settings::bus.key, m_bus);
    m_settings->setInt(settings::protocol.key, static_cast<int>(m_protocol));
    m_settings->setString(settings::bluetoothName, m_bluetooth.name());
    m_settings->setString(settings::bluetoothAddress, m_bluetooth.address());
    m_settings->setInt(settings::bluetoothPort, m_bluetooth.port());
    m_settings->setString(settings::serialDevice, m_serial.device());
    m_settings->setInt(settings::serialAutoBaudrate, m_serial.autoBaudrate() ? 1 : 0);
    m_settings->setInt(settings::serialBaudrate.key, m_serial.baudrate());
    m_settings->setInt(settings::serialInitialBaudrate.key, m_serial.initialBaudrate());
    m_settings->setString(settings::serialDescription, m_serial.description());
    m_settings->setString(settings::tcpAddress, m_tcp.address());
    m_settings->setInt(settings::tcpPort, m_tcp.port());
}

void ConnectionOptions::setBus(int bus)
{
    m_bus = bus;
    fire(ConnectionOptionsEvent::BusChanged);
}

void ConnectionOptions::setProtocol(VehicleProtocol protocol)
{
    m_protocol = protocol;
    fire(ConnectionOptionsEvent::ProtocolChanged);
}

void ConnectionOptions::setBluetoothDescriptor(BluetoothDescriptor const& descriptor)
{
    m_bluetooth = descriptor;
    fire(ConnectionOptionsEvent::BluetoothDescriptorChanged);
}

void ConnectionOptions::setSerialDescriptor(SerialDescriptor const& descriptor)
{
    m_serial = descriptor;
    fire(ConnectionOptionsEvent::SerialDescriptorChanged);
}

void ConnectionOptions::setTcpDescriptor(TcpDescriptor const& descriptor)
{
    m_tcp = descriptor;
    fire(ConnectionOptionsEvent::TcpDescriptorChanged);
}

void ConnectionOptions::addBluetoothDevice(BluetoothDescriptor const& device)
{
    m_remembered.add(device);
}

void ConnectionOptions::bluetoothDevices(std::vector<BluetoothDescriptor>& devices) const
{
    devices = m_remembered.devices();
}

} // namespace obd
