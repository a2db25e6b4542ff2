#include "libvelmora/port/bluetooth/rfcomm.h"

#include <cerrno>
#include <charconv>
#include <chrono>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds rfcommStopStep{100};
constexpr std::chrono::seconds rfcommConnectLimit{30}; // the kernel's own

// The result of a connect that goes on in the background.
int awaitConnected(int socket, OpeningStop const& stop)
{
    auto const end = std::chrono::steady_clock::now() + rfcommConnectLimit;
    while (std::chrono::steady_clock::now() < end) {
        if (stop && stop()) {
            return ECANCELED;
        }
        pollfd state{socket, POLLOUT, 0};
        if (::poll(&state, 1, static_cast<int>(rfcommStopStep.count())) > 0) {
            int error = 0;
            socklen_t size = sizeof(error);
            return ::getsockopt(socket, SOL_SOCKET, SO_ERROR, &error, &size) == 0 ? error : errno;
        }
    }
    return ETIMEDOUT;
}

} // namespace

int connectSocket(int socket, sockaddr_storage const& address, socklen_t size, OpeningStop const& stop)
{
    if (::connect(socket, reinterpret_cast<sockaddr const*>(&address), size) == 0) {
        return 0;
    }
    return errno == EINPROGRESS || errno == EAGAIN ? awaitConnected(socket, stop) : errno;
}

RfcommSocketAddress makeRfcommAddress(std::string const& mac, unsigned int channel)
{
    RfcommSocketAddress address{bluetoothFamily, {}, static_cast<std::uint8_t>(channel), 0};
    for (std::size_t i = 0; i < address.device.size(); ++i) {
        char const* const digits = mac.data() + 3 * (address.device.size() - 1 - i);
        std::from_chars(digits, digits + 2, address.device[i], 16);
    }
    return address;
}

RfcommCall KernelRfcomm::dial(std::string const& mac, unsigned int channel, OpeningStop const& stop)
{
    int const socket = ::socket(bluetoothFamily, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, rfcommProtocol);
    if (socket < 0) {
        return {-1, errno};
    }
    RfcommSocketAddress const address = makeRfcommAddress(mac, channel);
    sockaddr_storage storage{};
    static_assert(sizeof(address) <= sizeof(storage));
    __builtin_memcpy(&storage, &address, sizeof(address));
    int const error = connectSocket(socket, storage, sizeof(address), stop);
    if (error != 0) {
        ::close(socket);
        return {-1, error};
    }
    return {socket, 0};
}

} // namespace velmora
