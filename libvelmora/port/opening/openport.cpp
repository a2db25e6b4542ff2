#include "libvelmora/port/opening/openport.h"

#include "libvelmora/port/bluetooth/bleport.h"
#include "libvelmora/port/bluetooth/bluetoothport.h"
#include "libvelmora/port/peerport.h"
#include "libvelmora/port/serialport.h"
#include "libvelmora/port/tcpport.h"

#include <variant>

namespace velmora {

namespace {

struct Opener
{
    OpeningStop const& stop;

    std::unique_ptr<IPort> operator()(SerialAddress const& address) const { return openSerialPort(address); }
    std::unique_ptr<IPort> operator()(TcpAddress const& address) const { return openTcpPort(address, stop); }
    std::unique_ptr<IPort> operator()(SimulatorAddress const& address) const { return openSimulatorPort(address); }
    std::unique_ptr<IPort> operator()(ReplayAddress const& address) const { return openReplayPort(address); }
    std::unique_ptr<IPort> operator()(BluetoothAddress const& address) const
    {
        return openBluetoothPort(address, stop);
    }
    std::unique_ptr<IPort> operator()(BleAddress const& address) const { return openBlePort(address, stop); }
};

} // namespace

std::unique_ptr<IPort> openPort(PortAddress const& address, OpeningStop const& stop)
{
    return std::visit(Opener{stop}, address);
}

} // namespace velmora
