// Ports over sockets and serial lines, against real ones on this machine.

#include "libvelmora/port/serialport.h"
#include "libvelmora/port/tcpport.h"
#include "libvelmora/record/checkedfile.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <arpa/inet.h>
#include <cerrno>
#include <chrono>
#include <condition_variable>
#include <cstring>
#include <mutex>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using velmora::Error;
using velmora::ErrorKind;

// A listener on loopback that takes one client.
class Listener
{
public:
    Listener()
    {
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        socklen_t length = sizeof(address);
        EXPECT_EQ(::bind(m_listener, reinterpret_cast<sockaddr*>(&address), length), 0);
        EXPECT_EQ(::listen(m_listener, 1), 0);
        ::getsockname(m_listener, reinterpret_cast<sockaddr*>(&address), &length);
        m_port = ntohs(address.sin_port);
    }
    ~Listener()
    {
        hangUp();
        ::close(m_listener);
    }
    Listener(Listener const&) = delete;
    Listener& operator=(Listener const&) = delete;

    velmora::TcpAddress address() const { return {"127.0.0.1", m_port}; }
    void take() { m_client = ::accept(m_listener, nullptr, nullptr); }
    void say(std::string const& text) const
    {
        EXPECT_EQ(::send(m_client, text.data(), text.size(), 0), ssize_t(text.size()));
    }
    std::string hear(std::size_t size) const
    {
        std::string text(size, '\0');
        ssize_t const count = ::recv(m_client, text.data(), size, MSG_WAITALL);
        text.resize(count > 0 ? static_cast<std::size_t>(count) : 0);
        return text;
    }
    void hangUp()
    {
        if (m_client >= 0) {
            ::close(std::exchange(m_client, -1));
        }
    }

private:
    int m_listener = ::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    int m_client = -1;
    unsigned short m_port = 0;
};

// What a port brings.
struct Brought
{
    std::mutex mutex;
    std::condition_variable wake;
    std::string text;
    int losses = 0;

    void listenTo(velmora::IPort& port)
    {
        port.start(
            [this](std::string_view bytes) {
                std::lock_guard const lock(mutex);
                text += bytes;
                wake.notify_all();
            },
            [this] {
                std::lock_guard const lock(mutex);
                ++losses;
                wake.notify_all();
            });
    }
    template <typename Done>
    bool until(Done done)
    {
        std::unique_lock lock(mutex);
        return wake.wait_for(lock, std::chrono::seconds(10), done);
    }
};

TEST(TcpPort, SendsInOrderHoweverMuchWaitsAndTellsTheLossOnce)
{
    Listener listener;
    Brought brought;
    auto const port = velmora::openTcpPort(listener.address(), nullptr);
    listener.take();
    brought.listenTo(*port);
    std::string sent;
    for (int i = 0; i < 40; ++i) { // more than the buffers of both ends hold, so that some of it has to wait
        std::string const piece(200000, static_cast<char>('A' + i % 26));
        port->write(piece);
        sent += piece;
    }
    port->write("end");
    EXPECT_TRUE(listener.hear(sent.size() + 3) == sent + "end");
    listener.say("41 0C>");
    EXPECT_TRUE(brought.until([&] { return brought.text == "41 0C>"; })) << brought.text;
    listener.hangUp();
    EXPECT_TRUE(brought.until([&] { return brought.losses > 0; }));
    port->write("nobody hears it");
    port->close();
    EXPECT_EQ(brought.losses, 1);
}

// A command is a few bytes, and waits for nothing that could go with it.
TEST(TcpPort, SendsEachCommandAtOnce)
{
    Listener listener;
    auto const start = std::chrono::steady_clock::now();
    auto const port = velmora::openTcpPort(listener.address(), nullptr);
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(5));
    int found = 0;
    for (int descriptor = 3; descriptor < 256; ++descriptor) {
        sockaddr_in peer{};
        socklen_t length = sizeof(peer);
        int noDelay = 0;
        socklen_t size = sizeof(noDelay);
        if (::getpeername(descriptor, reinterpret_cast<sockaddr*>(&peer), &length) == 0 && peer.sin_family == AF_INET &&
            ntohs(peer.sin_port) == listener.address().port &&
            ::getsockopt(descriptor, IPPROTO_TCP, TCP_NODELAY, &noDelay, &size) == 0) {
            found += noDelay;
        }
    }
    EXPECT_EQ(found, 1);
}

TEST(TcpPort, AnEndOfItsOwnIsNoLoss)
{
    Listener listener;
    Brought brought;
    auto port = velmora::openTcpPort(listener.address(), nullptr);
    listener.take();
    brought.listenTo(*port);
    port->close();
    port.reset();
    EXPECT_EQ(brought.losses, 0);
    EXPECT_EQ(listener.hear(1), "") << "the other end sees that it is closed";
}

template <typename Open>
Error failureOf(Open open)
{
    try {
        open();
    } catch (Error const& error) {
        return error;
    }
    return {ErrorKind::Failed, "none"};
}

TEST(TcpPort, SaysWhyItCouldNotBeOpened)
{
    velmora::TcpAddress const nobody = Listener().address();
    Error const refused = failureOf([&] { velmora::openTcpPort(nobody, nullptr); });
    EXPECT_EQ(refused.kind(), ErrorKind::PortFailed);
    EXPECT_EQ(std::string(refused.what()),
              "Could not connect to 127.0.0.1:" + std::to_string(nobody.port) + ": Connection refused");
    EXPECT_EQ(refused.hints().size(), 3U);
    Error const stopped = failureOf([&] { velmora::openTcpPort(nobody, [] { return true; }); });
    EXPECT_EQ(stopped.kind(), ErrorKind::Interrupted);
}

TEST(SerialPort, SaysWhyItCouldNotBeOpened)
{
    testsupport::TemporaryFolder const folder;
    auto const failure = [](std::string const& device) {
        return failureOf([&] { velmora::openSerialPort({device, 38400}); });
    };
    Error const missing = failure(folder.file("ttyX"));
    EXPECT_EQ(missing.kind(), ErrorKind::PortFailed);
    EXPECT_EQ(std::string(missing.what()),
              "Could not open the serial port " + folder.file("ttyX") + ": No such file or directory");
    EXPECT_THAT(missing.hints(), ElementsAre(HasSubstr("is the adapter plugged in?"), HasSubstr("--port bt://MAC")));
    std::ofstream(folder.file("plain")) << "x";
    Error const plain = failure(folder.file("plain"));
    EXPECT_EQ(std::string(plain.what()), folder.file("plain") + " is no serial port");
    EXPECT_THAT(plain.hints(), ElementsAre(HasSubstr("`velmora ports`"), HasSubstr("replay:FILE")));
}

TEST(CheckedFile, IsMadeForAllToReadAndItsOwnerToWrite)
{
    testsupport::TemporaryFolder const folder;
    mode_t const before = ::umask(0);
    velmora::requireWritable(folder.file("log"), "log file");
    ::umask(before);
    struct stat status
    {};
    ASSERT_EQ(::stat(folder.file("log").c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777U, 0644U);
    std::ofstream(folder.file("log")) << "kept";
    velmora::requireWritable(folder.file("log"), "log file");
    EXPECT_EQ(folder.read("log"), "kept");
    Error const refused = failureOf([&] { velmora::requireWritable(folder.path(), "log file"); });
    EXPECT_THAT(refused.what(), HasSubstr("log file"));
    EXPECT_THAT(refused.what(), HasSubstr(std::strerror(EISDIR)));
}

} // namespace
