#include "libvelmora/port/bluetooth/rfcommport.h"

#include "libvelmora/port/asioport.h"
#include "libvelmora/port/bluetooth/bluetootherror.h"

#include <asio/generic/stream_protocol.hpp>

#include <algorithm>
#include <cerrno>
#include <poll.h>

namespace velmora {

namespace {

constexpr unsigned int lastGuessedChannel = 3;

// Waits in steps, so that Ctrl-C is heard.
void pauseBetween(std::chrono::milliseconds pause, OpeningStop const& stop)
{
    constexpr std::chrono::milliseconds step{50};
    for (auto left = pause; left.count() > 0 && !(stop && stop()); left -= step) {
        ::poll(nullptr, 0, static_cast<int>(std::min(step, left).count()));
    }
}

DialedSocket dialOne(BluetoothAddress const& address, unsigned int channel, IRfcommDialer& dialer,
                     OpeningStop const& stop)
{
    RfcommCall const call = dialer.dial(address.mac, channel, stop);
    if (call.error == 0) {
        return {call.socket, nullptr};
    }
    if (call.error == ECANCELED) {
        failInterruptedOpening();
    }
    throw rfcommError(address.mac, call.error);
}

DialedSocket guessChannel(BluetoothAddress const& address, RfcommWays const& ways, OpeningStop const& stop)
{
    for (unsigned int channel = 1; channel < lastGuessedChannel; ++channel) {
        RfcommCall const call = ways.dialer.dial(address.mac, channel, stop);
        if (call.error == 0) {
            return {call.socket, nullptr};
        }
        if (call.error == ECANCELED) {
            failInterruptedOpening();
        }
        if (call.error != ECONNREFUSED) {
            throw rfcommError(address.mac, call.error);
        }
        pauseBetween(ways.pause, stop);
    }
    return dialOne(address, lastGuessedChannel, ways.dialer, stop);
}

using asio::generic::stream_protocol;

class SocketPort : public AsioPort<stream_protocol::socket>
{
public:
    SocketPort(std::unique_ptr<asio::io_context> context, stream_protocol::socket stream, std::shared_ptr<void> keeper)
        : AsioPort(std::move(context), std::move(stream)), m_keeper(std::move(keeper))
    {}
    ~SocketPort() override { close(); }
    SocketPort(SocketPort const&) = delete;
    SocketPort& operator=(SocketPort const&) = delete;

private:
    std::shared_ptr<void> m_keeper;
};

} // namespace

DialedSocket dialAdapter(BluetoothAddress const& address, RfcommWays const& ways, OpeningStop const& stop)
{
    if (address.channel) {
        return dialOne(address, *address.channel, ways.dialer, stop);
    }
    if (ways.profile) {
        if (std::optional<DialedSocket> const dialed = ways.profile(address.mac, stop)) {
            return *dialed;
        }
    }
    if (stop && stop()) {
        failInterruptedOpening();
    }
    return guessChannel(address, ways, stop);
}

std::unique_ptr<IPort> makeSocketPort(DialedSocket dialed)
{
    auto context = std::make_unique<asio::io_context>();
    stream_protocol::socket stream(*context, stream_protocol(bluetoothFamily, rfcommProtocol), dialed.socket);
    return std::make_unique<SocketPort>(std::move(context), std::move(stream), std::move(dialed.keeper));
}

} // namespace velmora
