#include "libvelmora/port/bluetooth/adapterlist.h"
#include "libvelmora/port/bluetooth/bleport.h"
#include "libvelmora/port/bluetooth/bluetootherror.h"
#include "libvelmora/port/bluetooth/bluetoothport.h"
#include "libvelmora/port/bluetooth/pairing.h"
#include "libvelmora/port/bluetooth/rfcommport.h"

// In place of the files that speak to the system's Bluetooth service, where libsystemd was not there to build them.

namespace velmora {

namespace {

constexpr char const* reason = "this program was built without D-Bus support (libsystemd)";

} // namespace

bool hasBluetoothService()
{
    return false;
}

std::unique_ptr<IPort> openBluetoothPort(BluetoothAddress const& address, OpeningStop const& stop)
{
    KernelRfcomm dialer;
    return makeSocketPort(dialAdapter(address, {{}, dialer}, stop));
}

std::unique_ptr<IPort> openBlePort(BleAddress const& address, OpeningStop const&)
{
    throw noBusError("Could not connect to " + address.mac + " by Bluetooth Low Energy", reason);
}

std::vector<BluetoothEntry> listBluetoothAdapters(std::chrono::seconds, OpeningStop const&)
{
    throw noBusError("Bluetooth adapters can't be listed", reason);
}

void pairDevice(std::string const& mac, std::function<void(std::string const& line)> const&, OpeningStop const&)
{
    throw noBusError("Could not pair with " + mac, reason);
}

} // namespace velmora
