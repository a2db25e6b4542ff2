#include "libvelmora/channel/plainchannel.h"
#include "tests/support/wire/scriptedwire.h"

#include <gtest/gtest.h>

namespace {

using velmora::PlainChannel;
using velmora::WireTime;

class PlainChannelTest : public testing::Test
{
protected:
    void send(std::string const& text) { m_channel.send({text.begin(), text.end()}); }
    // "nothing" where nothing came.
    std::string receive(int timeoutMs = 1000)
    {
        std::vector<unsigned char> bytes;
        return m_channel.receive(bytes, timeoutMs) ? std::string(bytes.begin(), bytes.end()) : "nothing";
    }

    std::shared_ptr<support::ScriptedWire> m_wire = std::make_shared<support::ScriptedWire>();
    PlainChannel m_channel{m_wire};
};

TEST_F(PlainChannelTest, HandsOnWhatCameByteForByte)
{
    std::string const vin = "0902\rSEARCHING...\r014 \r0: 49 02 01 56 45 4C \r1: 4D 52 41 53 31 4D 4D \r\r";
    m_wire->on("0902", support::ScriptedWire::Reply{{vin.substr(0, 9)}, {vin.substr(9) + ">?\r\r", WireTime(400)}});
    send("0902\r");
    WireTime const sent = m_wire->now();
    EXPECT_EQ(receive(), vin);
    EXPECT_EQ(m_wire->now() - sent, WireTime(405)) << "no longer than it took";
    EXPECT_EQ(receive(10), "nothing") << "the next reply has no prompt yet";
    m_wire->say(">", WireTime(5));
    EXPECT_EQ(receive(), "?\r\r");
    EXPECT_EQ(m_wire->takeCommands(), std::vector<std::string>{"0902"}) << "nothing is sent unasked";
}

TEST_F(PlainChannelTest, WaitsNoLongerThanToldAndEndsWithTheLink)
{
    m_wire->on("ATMA", support::ScriptedWire::Reply{});
    send("ATMA\r");
    WireTime const before = m_wire->now();
    EXPECT_EQ(receive(300), "nothing");
    EXPECT_EQ(m_wire->now() - before, WireTime(300));
    m_wire->giveUp();
    EXPECT_FALSE(m_channel.isValid());
    EXPECT_EQ(receive(300), "nothing");
}

TEST_F(PlainChannelTest, CutsWhatHasNoEndIntoPieces)
{
    m_wire->say(std::string((1U << 20U) + 7, 'A'), WireTime(5));
    EXPECT_GE(receive().size(), 1U << 20U);
}

TEST_F(PlainChannelTest, LoggersSeeBothWays)
{
    struct PlainTap : obd::IConnectionLogger
    {
        void onDataSent(std::vector<unsigned char> const& data) override { seen.append(data.begin(), data.end()); }
        void onDataReceived(std::vector<unsigned char> const& data) override { seen.append(data.begin(), data.end()); }
        std::string seen;
    } tap;
    m_channel.addLogger(&tap);
    m_channel.setDelimiter('O');
    send("ATI\r");
    EXPECT_EQ(receive(), "");
    EXPECT_EQ(tap.seen, "ATI\r");
    m_channel.setDelimiter('>');
    EXPECT_EQ(receive(), "K\r\r");
    EXPECT_EQ(tap.seen, "ATI\rK\r\r");
    m_channel.removeLogger(&tap);
    send("ATI\r");
    EXPECT_EQ(tap.seen, "ATI\rK\r\r");
}

} // namespace
