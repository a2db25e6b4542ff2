#include "libvelmora/watch/servicenotify.h"

#include <algorithm>
#include <charconv>
#include <cstddef>
#include <cstdlib>
#include <cstring>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

namespace velmora {

namespace {

std::string environmentText(char const* name)
{
    char const* const value = std::getenv(name);
    return value == nullptr ? std::string() : value;
}

std::optional<long long> wholeNumber(std::string const& text)
{
    long long value = 0;
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    return error == std::errc() && end == text.data() + text.size() ? std::optional(value) : std::nullopt;
}

} // namespace

ServiceNotify::ServiceNotify() : m_socket(environmentText("NOTIFY_SOCKET"))
{
    std::optional<long long> const period = wholeNumber(environmentText("WATCHDOG_USEC"));
    std::optional<long long> const pid = wholeNumber(environmentText("WATCHDOG_PID"));
    if (period && *period > 0 && (!pid || *pid == ::getpid())) {
        m_period = std::chrono::microseconds(*period);
    }
}

void ServiceNotify::tell(std::string const& state) const
{
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    if (m_socket.empty() || m_socket.size() >= sizeof(address.sun_path)) {
        return;
    }
    std::memcpy(address.sun_path, m_socket.data(), m_socket.size());
    if (m_socket.front() == '@') { // an abstract one
        address.sun_path[0] = '\0';
    }
    int const socket = ::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0);
    if (socket >= 0) {
        auto const length = static_cast<socklen_t>(offsetof(sockaddr_un, sun_path) + m_socket.size());
        ::sendto(socket, state.data(), state.size(), MSG_NOSIGNAL | MSG_DONTWAIT,
                 reinterpret_cast<sockaddr const*>(&address), length);
        ::close(socket);
    }
}

void ServiceNotify::alive(std::chrono::steady_clock::time_point now)
{
    if (m_period && now >= m_next) {
        m_next = now + *m_period / 2;
        tell("WATCHDOG=1");
    }
}

} // namespace velmora
