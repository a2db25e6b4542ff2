#include "libvelmora/port/openport.h"

#include "libvelmora/port/peerport.h"
#include "libvelmora/port/serialport.h"
#include "libvelmora/port/tcpport.h"

#include <variant>

namespace velmora {

namespace {

struct Opener
{
    std::unique_ptr<IPort> operator()(SerialAddress const& address) const { return openSerialPort(address); }
    std::unique_ptr<IPort> operator()(TcpAddress const& address) const { return openTcpPort(address); }
    std::unique_ptr<IPort> operator()(SimulatorAddress const& address) const { return openSimulatorPort(address); }
    std::unique_ptr<IPort> operator()(ReplayAddress const& address) const { return openReplayPort(address); }
};

} // namespace

std::unique_ptr<IPort> openPort(PortAddress const& address)
{
    return std::visit(Opener{}, address);
}

} // namespace velmora
