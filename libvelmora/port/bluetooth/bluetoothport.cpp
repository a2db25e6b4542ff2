#include "libvelmora/port/bluetooth/bluetoothport.h"

#include "libvelmora/port/bluetooth/profiledial.h"
#include "libvelmora/port/bluetooth/rfcommport.h"

namespace velmora {

bool hasBluetoothService()
{
    return true;
}

std::unique_ptr<IPort> openBluetoothPort(BluetoothAddress const& address, OpeningStop const& stop)
{
    KernelRfcomm dialer;
    return makeSocketPort(dialAdapter(address, {dialByProfile, dialer}, stop));
}

} // namespace velmora
