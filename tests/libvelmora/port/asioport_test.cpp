// Bytes on their way through a real socket and a real pseudo-terminal.

#include "libvelmora/port/asioport.h"
#include "libvelmora/port/serialport.h"

#include <asio/buffer.hpp>
#include <asio/local/connect_pair.hpp>
#include <asio/local/stream_protocol.hpp>
#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <fcntl.h>
#include <future>
#include <poll.h>
#include <unistd.h>

namespace {

using velmora::IPort;
using LocalSocket = asio::local::stream_protocol::socket;

// A port at one end of a socket; the test holds the other.
struct SocketRig
{
    SocketRig()
    {
        auto context = std::make_unique<asio::io_context>();
        LocalSocket mine(*context);
        asio::local::connect_pair(mine, other);
        port = std::make_unique<velmora::AsioPort<LocalSocket>>(std::move(context), std::move(mine));
    }

    asio::io_context otherContext;
    LocalSocket other{otherContext};
    std::unique_ptr<IPort> port;
};

// Numbered lines, more of them than any buffer of the system holds.
std::string numberedLines()
{
    std::string text;
    for (int i = 0; text.size() < (1U << 20U); ++i) {
        text += std::to_string(i) + "\r";
    }
    return text;
}

void writeInPieces(IPort& port, std::string_view text)
{
    constexpr std::size_t piece = 1000;
    for (; !text.empty(); text.remove_prefix(std::min(piece, text.size()))) {
        port.write(text.substr(0, piece));
    }
}

std::string readAll(int file, std::size_t size)
{
    constexpr int patienceMs = 5000;
    std::string text;
    pollfd state{file, POLLIN, 0};
    while (text.size() < size && ::poll(&state, 1, patienceMs) > 0) {
        char bytes[4096];
        ssize_t const count = ::read(file, bytes, sizeof(bytes));
        if (count <= 0) {
            break;
        }
        text.append(bytes, static_cast<std::size_t>(count));
    }
    return text;
}

TEST(AsioPort, ARequestIsWrittenByWhoSendsIt)
{
    SocketRig rig;
    rig.port->write("ATI\r"); // no thread has been started
    EXPECT_EQ(rig.other.available(), 4U);
}

TEST(AsioPort, WhatTheSystemDoesNotTakeAtOnceFollowsInItsOrder)
{
    SocketRig rig;
    rig.port->start([](std::string_view) {}, [] {});
    std::string const text = numberedLines();
    writeInPieces(*rig.port, text);
    EXPECT_TRUE(readAll(rig.other.native_handle(), text.size()) == text);
}

TEST(AsioPort, ASerialLineTakesItsTimeInTheSameOrder)
{
    int const master = ::posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC);
    ASSERT_TRUE(::grantpt(master) == 0 && ::unlockpt(master) == 0);
    auto const port = velmora::openSerialPort({::ptsname(master), 115200});
    port->start([](std::string_view) {}, [] {});
    std::string const text = numberedLines();
    writeInPieces(*port, text);
    EXPECT_TRUE(readAll(master, text.size()) == text);
    port->close();
    ::close(master);
}

TEST(AsioPort, WhatWaitsGoesOutWithTheReadingOfWhoPulls)
{
    SocketRig rig;
    auto& port = dynamic_cast<velmora::IPulledPort&>(*rig.port);
    std::string const text = numberedLines();
    writeInPieces(port, text);
    std::string sent;
    std::string came;
    for (int i = 0; i < 2000 && sent.size() < text.size(); ++i) {
        std::string piece(rig.other.available(), ' ');
        sent += piece.substr(0, rig.other.read_some(asio::buffer(piece)));
        EXPECT_TRUE(port.pull(came, std::chrono::steady_clock::now() + std::chrono::milliseconds(1)));
    }
    EXPECT_TRUE(sent == text);
    EXPECT_EQ(came, "");
    rig.other.close();
    EXPECT_FALSE(port.isUp());
    EXPECT_FALSE(port.pull(came, velmora::IPulledPort::Moment::max()));
    EXPECT_FALSE(port.pull(came, velmora::IPulledPort::Moment::max())) << "for good";
}

// A write to a socket whose other end is gone raises a signal that ends programs, unless it is told not to.
TEST(AsioPort, ALinkThatBreaksIsToldOnceAndTakesNothingMore)
{
    SocketRig rig;
    rig.other.close();
    rig.port->write("010C\r");
    std::promise<void> lost;
    std::atomic<int> losses{0};
    rig.port->start([](std::string_view) {},
                    [&] {
                        if (++losses == 1) {
                            lost.set_value();
                        }
                    });
    EXPECT_EQ(lost.get_future().wait_for(std::chrono::seconds(5)), std::future_status::ready);
    rig.port->write("010D\r");
    rig.port->close();
    rig.port->write("0105\r");
    EXPECT_EQ(losses, 1);
}

} // namespace
