#include "libvelmora/channel/portwire.h"
#include "libvelmora/port/asioport.h"

#include <asio/buffer.hpp>
#include <asio/local/connect_pair.hpp>
#include <asio/local/stream_protocol.hpp>
#include <asio/write.hpp>
#include <gtest/gtest.h>

#include <filesystem>

namespace {

// A port whose adapter a test plays.
class PlayedPort : public velmora::IPort
{
public:
    explicit PlayedPort(Receiver& receiver) : m_receiver(receiver) {}
    void start(Receiver onBytes, LossHandler /*onLost*/) override { m_receiver = std::move(onBytes); }
    void write(std::string_view /*bytes*/) override {}
    void close() override {}

private:
    Receiver& m_receiver;
};

// A port that brings more than anybody asks for, whenever it is read.
class FloodingPort : public velmora::IPulledPort
{
public:
    explicit FloodingPort(std::size_t size) : m_flood(size, '>') {}
    void start(Receiver /*onBytes*/, LossHandler /*onLost*/) override { FAIL() << "it can be pulled"; }
    void write(std::string_view /*bytes*/) override {}
    void close() override {}
    bool pull(std::string& bytes, Moment /*until*/) override
    {
        bytes += m_flood;
        return true;
    }
    void interrupt() override {}
    bool isUp() override { return true; }

private:
    std::string const m_flood;
};

// A wire over one end of a socket; the test holds the other.
struct SocketWire
{
    using Socket = asio::local::stream_protocol::socket;

    SocketWire()
    {
        auto context = std::make_unique<asio::io_context>();
        Socket mine(*context);
        asio::local::connect_pair(mine, other);
        wire = std::make_unique<velmora::PortWire>(
            std::make_unique<velmora::AsioPort<Socket>>(std::move(context), std::move(mine)));
    }

    asio::io_context otherContext;
    Socket other{otherContext};
    std::unique_ptr<velmora::PortWire> wire;
};

constexpr velmora::WireTime longTime{20000}; // a test that waits for all of it has failed

std::ptrdiff_t threadsHere()
{
    return std::distance(std::filesystem::directory_iterator("/proc/self/task"), {});
}

TEST(PortWire, AFloodEndsTheLinkAndFillsNoMemory)
{
    velmora::IPort::Receiver say;
    velmora::PortWire wire(std::make_unique<PlayedPort>(say));
    std::string const piece(64U << 10U, '>');
    for (int i = 0; i < 15; ++i) {
        say(piece);
    }
    EXPECT_TRUE(wire.isUp());
    EXPECT_EQ(wire.read(wire.now()).size(), 15 * piece.size());
    for (int i = 0; i < 100; ++i) {
        say(piece);
    }
    EXPECT_FALSE(wire.isUp());
    EXPECT_EQ(wire.read(wire.now()).size(), 17 * piece.size()) << "what was too much, and nothing behind it";
}

TEST(PortWire, AFloodThatNobodyHadReadEndsTheLink)
{
    velmora::PortWire calm(std::make_unique<FloodingPort>(4096));
    EXPECT_EQ(calm.read(calm.now()).size(), 4096U);
    EXPECT_TRUE(calm.isUp());
    velmora::PortWire flooded(std::make_unique<FloodingPort>(1U << 20U));
    flooded.read(flooded.now());
    EXPECT_FALSE(flooded.isUp());
    EXPECT_FALSE(flooded.lost()) << "the port is still there";
    EXPECT_EQ(flooded.read(flooded.now()), "");
}

TEST(PortWire, IsDownWhileItIsGivenUp)
{
    velmora::IPort::Receiver say;
    velmora::PortWire wire(std::make_unique<PlayedPort>(say));
    wire.giveUp();
    EXPECT_FALSE(wire.isUp());
    EXPECT_FALSE(wire.lost()) << "the link itself is whole";
    EXPECT_TRUE(wire.resume());
    EXPECT_TRUE(wire.isUp());
}

// To hand a reply from a thread of the port to its reader costs more than to read it.
TEST(PortWire, WhoWaitsForASocketsBytesReadsThemWithoutAnotherThread)
{
    std::ptrdiff_t const before = threadsHere();
    SocketWire rig;
    EXPECT_EQ(threadsHere(), before);
    rig.wire->write("ATI\r");
    EXPECT_EQ(rig.other.available(), 4U);
    EXPECT_EQ(rig.wire->read(rig.wire->now()), "") << "a look does not wait";
    asio::write(rig.other, asio::buffer(std::string("ELM327 v1.5\r\r>")));
    EXPECT_EQ(rig.wire->read(rig.wire->now() + longTime), "ELM327 v1.5\r\r>");
    std::string const much(100000, 'A'); // in many pieces
    asio::write(rig.other, asio::buffer(much));
    EXPECT_EQ(rig.wire->read(rig.wire->now()), much);
}

TEST(PortWire, WhoeverAsksFindsOutThatASocketIsGone)
{
    SocketWire rig;
    rig.other.close();
    EXPECT_TRUE(rig.wire->lost()) << "though nobody reads";
    EXPECT_FALSE(rig.wire->isUp());
    EXPECT_FALSE(rig.wire->resume());
    SocketWire resumed;
    resumed.other.close();
    EXPECT_FALSE(resumed.wire->resume()) << "whoever asks first";
    SocketWire read;
    EXPECT_TRUE(read.wire->isUp());
    read.other.close();
    EXPECT_EQ(read.wire->read(read.wire->now() + longTime), "");
    EXPECT_TRUE(read.wire->lost());
}

TEST(PortWire, GivingASocketUpEndsItsRead)
{
    SocketWire rig;
    velmora::WireTime const start = rig.wire->now();
    rig.wire->giveUp();
    EXPECT_EQ(rig.wire->read(start + longTime), "");
    rig.wire->resume();
    EXPECT_EQ(rig.wire->read(start + longTime), "") << "one that had begun before ends, too";
    EXPECT_LT(rig.wire->now() - start, longTime / 2);
    rig.wire->giveUp();
    rig.other.close();
    EXPECT_EQ(rig.wire->read(start + longTime), "");
    EXPECT_FALSE(rig.wire->lost()) << "it was given up here";
}

} // namespace
