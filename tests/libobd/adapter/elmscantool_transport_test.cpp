#include "tests/libobd/adapter/elmscantoolfixture.h"

#include <functional>

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

using ElmScantoolTransport = ElmScantoolFixture;

TEST_F(ElmScantoolTransport, RepliesEndAtThePromptFromTheStart)
{
    EXPECT_EQ(m_channel->delimiter(), '>');
    EXPECT_THAT(m_channel->log(), IsEmpty());
}

TEST_F(ElmScantoolTransport, DeadConnectionDisablesTheDeviceOnSending)
{
    connect();
    m_channel->invalidateAfter(0);
    std::string response = "untouched";
    EXPECT_EQ(m_device.execute("ATRV", response, 500), Status::NotSent);
    EXPECT_EQ(response, "untouched");
    EXPECT_FALSE(m_device.isEnabled());
    EXPECT_EQ(m_device.device(), "");
    EXPECT_THAT(sent(), IsEmpty());
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Invalid connection -> skip"));

    EXPECT_EQ(m_device.execute("ATRV", response, 500), Status::NotSent);
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Invalid connection -> skip")) << "without a word from now on";
}

TEST_F(ElmScantoolTransport, ConnectionLostDuringALongReadEndsItAndDisablesTheDevice)
{
    connect();
    m_channel->expect("0100");
    m_channel->invalidateAfter(3100);
    std::string response;
    unsigned int const start = m_channel->now();
    EXPECT_EQ(m_device.execute("0100", response, 10000), Status::NotEnabled);
    EXPECT_EQ(m_channel->now() - start, 3250u);
    EXPECT_FALSE(m_device.isEnabled());
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Invalid connection -> skip"));
}

TEST_F(ElmScantoolTransport, TimeoutLeavesTheDeviceEnabled)
{
    connect();
    m_channel->expect("010C");
    std::string response = "old";
    EXPECT_EQ(m_device.execute("010C", response, 700), Status::NoResponse);
    EXPECT_EQ(response, "");
    EXPECT_TRUE(m_device.isEnabled());
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(ElmScantoolTransport, ReadWithoutTimeThatFindsNothingDisablesTheDevice)
{
    connect();
    m_channel->expect("010C").after(1).reply("41 0C 1A F8\r\r>");
    std::string response;
    EXPECT_EQ(m_device.execute("010C", response, 0), Status::NotEnabled);
    EXPECT_FALSE(m_device.isEnabled());
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Failed to receive data"));
}

TEST_F(ElmScantoolTransport, ErrorWordEmptiesTheReplyAndLeavesTheDeviceEnabled)
{
    connect();
    m_channel->expect("0100").reply("SEARCHING...\rUNABLE TO CONNECT\r\r>");
    std::string response;
    EXPECT_EQ(m_device.execute("0100", response, 1000), Status::NoResponse);
    EXPECT_EQ(response, "");
    EXPECT_TRUE(m_device.isEnabled());
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Got error from adapter: 12"));
}

TEST_F(ElmScantoolTransport, BesideNoResponseItTellsWhatTheAdapterSaid)
{
    connect();
    struct Row
    {
        char const* reply;
        obd::AdapterNote note;
    };
    for (Row const& row :
         {Row{"BUFFER FULL\r\r>", obd::AdapterNote::ReplyLost}, Row{"?\r\r>", obd::AdapterNote::NotUnderstood},
          Row{"NO DATA\r\r>", obd::AdapterNote::None}, Row{"\r\r>", obd::AdapterNote::None}}) {
        m_channel->expect("0105").reply(row.reply);
        std::string response;
        EXPECT_EQ(m_device.execute("0105", response, 1000), Status::NoResponse);
        EXPECT_EQ(m_device.lastNote(), row.note) << row.reply;
    }
}

TEST_F(ElmScantoolTransport, SearchNoticeStaysInTheReply)
{
    connect();
    m_channel->expect("0100").reply("SEARCHING...\r41 00 BE 3E A8 11\r\r>");
    std::string response;
    EXPECT_EQ(m_device.execute("0100", response, 1000), Status::Ok);
    EXPECT_EQ(response, "SEARCHING...41 00 BE 3E A8 11");
}

TEST_F(ElmScantoolTransport, DisabledDeviceStillWaitsItsTimeButSendsNothing)
{
    support::expectClose(*m_channel);
    m_device.close();
    unsigned int const start = m_channel->now();
    // The flush in front of the reset is a bare read.
    EXPECT_FALSE(m_device.resetInterface());
    EXPECT_EQ(m_channel->now() - start, 200u);
    EXPECT_THAT(m_channel->sentBytes(), ElementsAre("ATLP\r"));
}

// A channel that lets a test act while the driver waits in a read.
class InterruptedChannel : public support::ScriptedChannel
{
public:
    using ScriptedChannel::ScriptedChannel;
    bool receive(std::vector<unsigned char>& out, int timeoutMs) override
    {
        if (duringRead && timeoutMs > 0) {
            std::exchange(duringRead, nullptr)();
        }
        return ScriptedChannel::receive(out, timeoutMs);
    }
    std::function<void()> duringRead;
};

TEST_F(ElmScantoolTransport, ReplyToADeviceThatWasClosedMeanwhileIsDropped)
{
    auto channel = std::make_shared<InterruptedChannel>(m_clock);
    obd::ElmScantool device(channel);
    channel->expect("010C").after(60).reply("NO DATA\r\r>");
    channel->expect("ATLP");
    channel->duringRead = [&device] { device.close(); };
    std::string response;
    EXPECT_EQ(device.execute("010C", response, 1000), Status::NotEnabled);
    EXPECT_EQ(response, "");
    EXPECT_THAT(m_log.lines(), IsEmpty()) << "nobody looks for error words any more";
}

} // namespace
