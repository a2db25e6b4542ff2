#pragma once

#include <gtest/gtest.h>

#include <cstddef>
#include <cstdlib>
#include <cstring>
#include <string>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

namespace velmora::test {

// The service manager's end of the socket.
class Manager
{
public:
    explicit Manager(std::string const& name) : m_socket(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0))
    {
        sockaddr_un address{};
        address.sun_family = AF_UNIX;
        std::memcpy(address.sun_path, name.data(), name.size());
        if (name.front() == '@') {
            address.sun_path[0] = '\0';
        }
        auto const length = static_cast<socklen_t>(offsetof(sockaddr_un, sun_path) + name.size());
        EXPECT_EQ(::bind(m_socket, reinterpret_cast<sockaddr*>(&address), length), 0);
        ::setenv("NOTIFY_SOCKET", name.c_str(), 1);
    }
    ~Manager()
    {
        ::close(m_socket);
        for (char const* const name : {"NOTIFY_SOCKET", "WATCHDOG_USEC", "WATCHDOG_PID"}) {
            ::unsetenv(name);
        }
    }
    Manager(Manager const&) = delete;
    Manager& operator=(Manager const&) = delete;

    // What has come, "-" for nothing.
    std::string heard() const
    {
        char text[256];
        ssize_t const count = ::recv(m_socket, text, sizeof(text), MSG_DONTWAIT);
        return count < 0 ? "-" : std::string(text, static_cast<std::size_t>(count));
    }

private:
    int m_socket;
};

} // namespace velmora::test
