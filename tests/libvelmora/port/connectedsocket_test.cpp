// How a socket is connected that somebody may stop.

#include "libvelmora/port/bluetooth/rfcomm.h"

#include <gtest/gtest.h>

#include <arpa/inet.h>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <sys/socket.h>
#include <unistd.h>
#include <utility>
#include <vector>

namespace {

using namespace std::chrono_literals;

sockaddr_storage asStorage(sockaddr_in const& address)
{
    sockaddr_storage storage{};
    std::memcpy(&storage, &address, sizeof(address));
    return storage;
}

// A listener that takes so few that one more has to wait.
class FullListener
{
public:
    FullListener()
    {
        m_address.sin_family = AF_INET;
        m_address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        socklen_t length = sizeof(m_address);
        EXPECT_EQ(::bind(m_listener, reinterpret_cast<sockaddr*>(&m_address), length), 0);
        EXPECT_EQ(::listen(m_listener, 0), 0);
        ::getsockname(m_listener, reinterpret_cast<sockaddr*>(&m_address), &length);
    }
    ~FullListener() { ::close(m_listener); }
    FullListener(FullListener const&) = delete;
    FullListener& operator=(FullListener const&) = delete;

    // The errno of a connection; the socket stays open as long as this.
    int connect(velmora::OpeningStop const& stop)
    {
        m_sockets.emplace_back(::socket(AF_INET, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0));
        return velmora::connectSocket(m_sockets.back().number, asStorage(m_address), sizeof(m_address), stop);
    }
    sockaddr_in const& address() const { return m_address; }

private:
    struct Socket
    {
        explicit Socket(int opened) : number(opened) {}
        ~Socket()
        {
            if (number >= 0) {
                ::close(number);
            }
        }
        Socket(Socket&& other) noexcept : number(std::exchange(other.number, -1)) {}
        Socket& operator=(Socket&&) = delete;
        int number;
    };

    int m_listener = ::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    sockaddr_in m_address{};
    std::vector<Socket> m_sockets;
};

TEST(ConnectedSocket, IsWaitedForUntilSomebodyStops)
{
    FullListener listener;
    EXPECT_EQ(listener.connect({}), 0);
    EXPECT_EQ(listener.connect([] { return true; }), ECANCELED);
    int asked = 0;
    int error = 0;
    auto const start = std::chrono::steady_clock::now();
    for (int i = 0; i < 4 && error == 0; ++i) { // as many as the system queues
        asked = 0;
        error = listener.connect([&asked] { return ++asked == 3; });
    }
    EXPECT_EQ(error, ECANCELED);
    EXPECT_EQ(asked, 3);
    EXPECT_GE(std::chrono::steady_clock::now() - start, 190ms) << "it is asked each tenth of a second";
}

TEST(ConnectedSocket, TellsWhyThereIsNone)
{
    sockaddr_in const nobody = FullListener().address();
    int const socket = ::socket(AF_INET, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0);
    EXPECT_EQ(velmora::connectSocket(socket, asStorage(nobody), sizeof(nobody), [] { return false; }), ECONNREFUSED);
    EXPECT_EQ(velmora::connectSocket(-1, asStorage(nobody), sizeof(nobody), {}), EBADF);
    ::close(socket);
}

} // namespace
