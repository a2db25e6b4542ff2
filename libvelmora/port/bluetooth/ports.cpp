#include "libvelmora/port/bluetooth/adapterlist.h"
#include "libvelmora/port/bluetooth/pairing.h"
#include "libvelmora/port/portaddress.h"
#include "libvelmora/port/serialportlist.h"

#include <velmora/ports.h>

namespace velmora {

std::vector<SerialPortEntry> serialPorts()
{
    return listSerialPorts();
}

std::vector<BluetoothEntry> bluetoothAdapters(std::chrono::seconds search, StopAsked const& stop)
{
    return listBluetoothAdapters(search, stop);
}

std::string pairBluetooth(std::string const& device, std::function<void(std::string const& line)> const& tell,
                          StopAsked const& stop)
{
    std::string const text = device.starts_with("bt://")    ? device.substr(5)
                             : device.starts_with("ble://") ? device.substr(6)
                                                            : device;
    std::string mac = parseBluetoothMac(text);
    pairDevice(mac, tell, stop);
    return mac;
}

} // namespace velmora
