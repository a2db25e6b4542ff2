#include "tests/libobd/adapter/elmscantoolfixture.h"

#include <stdexcept>

namespace {

using namespace std::string_view_literals;
using support::Dialogue;
using testing::ElementsAre;
using testing::IsEmpty;

using BaudRateChange = ElmScantoolFixture;

TEST_F(BaudRateChange, ElmGetsTheDivisor)
{
    nameAdapter("ELM327 v1.5");
    struct Row
    {
        obd::BaudRate rate;
        char const* command;
    };
    for (Row const row :
         {Row{19200, "ATBRDD0"}, Row{38400, "ATBRD68"}, Row{57600, "ATBRD45"}, Row{115200, "ATBRD23"}}) {
        m_channel->expect(row.command).reply("OK\r");
        EXPECT_TRUE(m_device.changeBaudRate(row.rate)) << row.rate;
    }
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(BaudRateChange, ObdProsGetsTheCode)
{
    nameAdapter("OBDPros LLC v2");
    struct Row
    {
        obd::BaudRate rate;
        char const* command;
    };
    for (Row const row : {Row{9600, "ATSCS1"}, Row{19200, "ATSCS3"}, Row{38400, "ATSCS4"}, Row{57600, "ATSCS5"},
                          Row{115200, "ATSCS6"}}) {
        m_channel->expect(row.command).reply("OK\r");
        EXPECT_TRUE(m_device.changeBaudRate(row.rate)) << row.rate;
    }
}

TEST_F(BaudRateChange, RateThatTheAdapterLacksSendsNothing)
{
    nameAdapter("ELM327 v1.5");
    EXPECT_FALSE(m_device.changeBaudRate(9600));
    EXPECT_FALSE(m_device.changeBaudRate(0));
    EXPECT_THAT(sent(), IsEmpty());
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Baud rate not supported: 9600", "FATAL Baud rate not supported: 0"));
    EXPECT_EQ(m_channel->delimiter(), '>');
}

TEST_F(BaudRateChange, RateThatObdProsLacksSendsNothing)
{
    nameAdapter("OBDPros LLC v2");
    EXPECT_FALSE(m_device.changeBaudRate(500000));
    EXPECT_THAT(sent(), IsEmpty());
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Baud rate not supported: 500000"));
}

TEST_F(BaudRateChange, ObdKeyRefusesEveryRate)
{
    nameAdapter("OBDKey 1.30");
    for (obd::BaudRate const rate : {9600U, 115200U}) {
        m_log.clear();
        EXPECT_FALSE(m_device.changeBaudRate(rate));
        EXPECT_THAT(m_log.lines(), ElementsAre("FATAL OBDKey doesn't really support the feature",
                                               "FATAL Baud rate not supported: " + std::to_string(rate)));
    }
    EXPECT_THAT(sent(), IsEmpty());
}

TEST_F(BaudRateChange, RepliesEndWithTheirLineDuringTheChange)
{
    nameAdapter("ELM327 v1.5");
    m_channel->expect("ATBRD23").after(20).reply("OK\r");
    EXPECT_TRUE(m_device.changeBaudRate(115200));
    EXPECT_THAT(dialogues(), ElementsAre(Dialogue{"ATBRD23", 220}));
    EXPECT_EQ(m_channel->delimiter(), '>');
}

TEST_F(BaudRateChange, PromptIsBackWhateverTheResult)
{
    nameAdapter("ELM327 v1.5");
    m_channel->expect("ATBRD23").reply("?\r");
    EXPECT_FALSE(m_device.changeBaudRate(115200));
    EXPECT_EQ(m_channel->delimiter(), '>');
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to get response to baud rate change. Response: "));
    m_channel->invalidateAfter(0);
    EXPECT_FALSE(m_device.changeBaudRate(115200));
    EXPECT_EQ(m_channel->delimiter(), '>');
}

// An application's own channel may throw.
class ThrowingChannel : public support::ScriptedChannel
{
public:
    using ScriptedChannel::ScriptedChannel;
    bool receive(std::vector<unsigned char>& /*out*/, int /*timeoutMs*/) override
    {
        delimiterAtRead = delimiter();
        throw std::runtime_error("port gone");
    }
    char delimiterAtRead = 0;
};

TEST_F(BaudRateChange, PromptIsBackAfterAnException)
{
    auto channel = std::make_shared<ThrowingChannel>(m_clock);
    obd::ElmScantool device(channel);
    EXPECT_THROW(device.changeBaudRate(115200), std::runtime_error);
    EXPECT_EQ(channel->delimiterAtRead, '\r');
    EXPECT_EQ(channel->delimiter(), '>');
    EXPECT_THROW(device.handleBaudRateChange(), std::runtime_error);
    EXPECT_EQ(channel->delimiter(), '>');
}

TEST_F(BaudRateChange, SetTimeoutIsInStepsOfFiveMilliseconds)
{
    struct Row
    {
        unsigned int ms;
        char const* command;
    };
    for (Row const row :
         {Row{75, "ATBRT0F"}, Row{5000, "ATBRTFF"}, Row{3, "ATBRT00"}, Row{0, "ATBRT00"}, Row{4, "ATBRT00"},
          Row{5, "ATBRT01"}, Row{1275, "ATBRTFF"}, Row{1274, "ATBRTFE"}, Row{1276, "ATBRTFF"}, Row{860, "ATBRTAC"}}) {
        m_channel->expect(row.command).reply("OK\r\r>");
        EXPECT_TRUE(m_device.setBaudRateSetTimeout(row.ms)) << row.ms;
    }
    m_channel->expect("ATBRT0F").reply("?\r\r>");
    EXPECT_FALSE(m_device.setBaudRateSetTimeout(75));
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to set baud rate set timeout. Response: "));
}

TEST_F(BaudRateChange, ObdProsHasNoTimeToSet)
{
    nameAdapter("OBDPros LLC v2");
    EXPECT_TRUE(m_device.setBaudRateSetTimeout(75));
    EXPECT_THAT(sent(), IsEmpty());
}

TEST_F(BaudRateChange, IdentityAtTheNewRateIsConfirmedWithACarriageReturn)
{
    nameAdapter("ELM327 v1.5");
    m_channel->unasked().after(60).reply("\0\0ELM327 v1.5\r"sv);
    m_channel->expectBytes("\r").after(5).reply("OK\r\r>");
    unsigned int const start = m_channel->now();
    EXPECT_TRUE(m_device.handleBaudRateChange());
    EXPECT_EQ(m_channel->now() - start, 60u + 200u + 205u);
    EXPECT_THAT(sent(), ElementsAre("\r"));
    EXPECT_EQ(m_channel->delimiter(), '>');
}

TEST_F(BaudRateChange, GarbageAtTheNewRateIsNotConfirmed)
{
    nameAdapter("ELM327 v1.5");
    m_channel->unasked().after(5).reply("\xFE\xFE\r");
    EXPECT_FALSE(m_device.handleBaudRateChange());
    EXPECT_THAT(sent(), IsEmpty());
    EXPECT_EQ(m_channel->delimiter(), '>');
}

TEST_F(BaudRateChange, SilenceAtTheNewRateIsNotConfirmed)
{
    nameAdapter("ELM327 v1.5");
    unsigned int const start = m_channel->now();
    EXPECT_FALSE(m_device.handleBaudRateChange());
    EXPECT_EQ(m_channel->now() - start, 700u);
}

TEST_F(BaudRateChange, ConfirmationThatIsNotAnsweredIsAFailure)
{
    nameAdapter("ELM327 v1.5");
    m_channel->unasked().after(5).reply("ELM327 v1.5\r");
    m_channel->expectBytes("\r");
    EXPECT_FALSE(m_device.handleBaudRateChange());
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to get final response to baud rate change. Response: "));
}

TEST_F(BaudRateChange, ObdProsIsOnlyAskedForItsName)
{
    nameAdapter("OBDPros LLC v2");
    m_channel->expect("ATI").reply("OBDPros LLC v2\r\r>");
    EXPECT_TRUE(m_device.handleBaudRateChange());
    EXPECT_THAT(sent(), ElementsAre("ATI\r"));
}

TEST_F(BaudRateChange, WholeChange)
{
    nameAdapter("ELM327 v1.5");
    m_channel->expect("ATBRT28").after(5).reply("OK\r\r>");
    m_channel->expect("ATBRD23").after(5).reply("OK\r").after(230).reply("ELM327 v1.5\r");
    m_channel->expectBytes("\r").after(5).reply("OK\r\r>");
    EXPECT_TRUE(m_device.setBaudRateSetTimeout(200));
    EXPECT_TRUE(m_device.changeBaudRate(115200));
    EXPECT_TRUE(m_device.handleBaudRateChange());
    EXPECT_THAT(dialogues(),
                ElementsAre(Dialogue{"ATBRT28", 205}, Dialogue{"ATBRD23", 205 + 30 + 200}, Dialogue{"", 205}));
}

} // namespace
