#include "libvelmora/channel/portwire.h"

#include <gtest/gtest.h>

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

} // namespace
