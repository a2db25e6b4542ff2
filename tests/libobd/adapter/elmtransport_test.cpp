#include "libobd/adapter/elmtransport.h"
#include "tests/support/logcapture.h"
#include "tests/support/wire/scriptedchannel.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using namespace std::string_view_literals;
using obd::TransportStatus;
using support::bytes;
using support::text;
using testing::ElementsAre;
using testing::IsEmpty;

class ElmTransport : public testing::Test
{
protected:
    ElmTransport() { m_channel->setDelimiter('>'); }

    TransportStatus send(std::string_view payload) { return obd::elmTransportSend(m_connection, bytes(payload)); }
    TransportStatus receive(unsigned int timeoutMs)
    {
        return obd::elmTransportReceive(m_connection, m_data, timeoutMs);
    }

    support::FakeClock m_clock;
    support::LogCapture m_log;
    std::shared_ptr<support::ScriptedChannel> m_channel = std::make_shared<support::ScriptedChannel>(m_clock);
    std::shared_ptr<obd::IDataConnection> m_connection = m_channel;
    std::vector<unsigned char> m_data = bytes("old");
};

TEST_F(ElmTransport, SendEndsTheLineWithACarriageReturn)
{
    m_channel->expectBytes("ATI\r");
    EXPECT_EQ(send("ATI"), TransportStatus::Ok);
    m_channel->expectBytes("\r");
    EXPECT_EQ(send(""), TransportStatus::Ok);
}

TEST_F(ElmTransport, SendOnADeadConnectionIsSkipped)
{
    m_channel->invalidateAfter(0);
    EXPECT_EQ(send("ATI"), TransportStatus::Timeout);
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Invalid connection -> skip"));
    EXPECT_THAT(m_channel->sentBytes(), IsEmpty());
}

TEST_F(ElmTransport, LineEndsAndPromptAreCleanedAway)
{
    m_channel->unasked().reply("OK\r\r>");
    EXPECT_EQ(receive(500), TransportStatus::Ok);
    EXPECT_EQ(text(m_data), "OK");
    EXPECT_EQ(m_channel->now(), 0u);
}

TEST_F(ElmTransport, PromptAloneIsATimeoutWithoutWaiting)
{
    m_channel->unasked().reply(">");
    EXPECT_EQ(receive(500), TransportStatus::Timeout);
    EXPECT_THAT(m_data, IsEmpty());
    EXPECT_EQ(m_channel->now(), 0u);
}

TEST_F(ElmTransport, QuestionMarkAloneIsATimeoutWithoutWaiting)
{
    m_channel->unasked().after(20).reply("?\r\r>");
    EXPECT_EQ(receive(500), TransportStatus::Timeout);
    EXPECT_THAT(m_data, IsEmpty());
    EXPECT_EQ(m_channel->now(), 20u);
}

TEST_F(ElmTransport, NulBytesNeverReachTheCaller)
{
    m_channel->unasked().reply("\0\0OK\0\r\n\r\0>"sv);
    EXPECT_EQ(receive(500), TransportStatus::Ok);
    EXPECT_EQ(text(m_data), "OK");
}

TEST_F(ElmTransport, LinesBecomeOneRunAndBlanksStay)
{
    m_channel->unasked().reply("SEARCHING...\r\n7E8 06 41 00 BE 3F A8 13 \r\n7E9 06 41 00 80 00 00 01 \r\n\r\n>");
    EXPECT_EQ(receive(500), TransportStatus::Ok);
    EXPECT_EQ(text(m_data), "SEARCHING...7E8 06 41 00 BE 3F A8 13 7E9 06 41 00 80 00 00 01 ");
}

TEST_F(ElmTransport, PromptInsideAMessageOfAnotherDelimiterGoesToo)
{
    m_channel->setDelimiter('\r');
    m_channel->unasked().reply(">O>K?\r");
    EXPECT_EQ(receive(500), TransportStatus::Ok);
    EXPECT_EQ(text(m_data), "OK");
}

TEST_F(ElmTransport, WaitIsCutInSlices)
{
    EXPECT_EQ(receive(700), TransportStatus::Timeout);
    EXPECT_THAT(m_channel->readTimeouts(), ElementsAre(250, 250, 200));
    EXPECT_EQ(m_channel->now(), 700u);
    EXPECT_THAT(m_data, IsEmpty()) << "a vector with old content must not pass for a reply";
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(ElmTransport, WholeSlicesMakeNoEmptyOne)
{
    EXPECT_EQ(receive(500), TransportStatus::Timeout);
    EXPECT_THAT(m_channel->readTimeouts(), ElementsAre(250, 250));
}

TEST_F(ElmTransport, ConnectionIsLookedAtBeforeEverySlice)
{
    struct Row
    {
        unsigned int diesAtMs;
        unsigned int endsAtMs;
    };
    for (Row const row : {Row{0, 0}, Row{1, 250}, Row{250, 250}, Row{251, 500}, Row{500, 500}, Row{501, 700}}) {
        auto channel = std::make_shared<support::ScriptedChannel>(m_clock);
        std::shared_ptr<obd::IDataConnection> connection = channel;
        channel->invalidateAfter(row.diesAtMs);
        EXPECT_EQ(obd::elmTransportReceive(connection, m_data, 700), TransportStatus::Failure);
        EXPECT_EQ(channel->now(), row.endsAtMs) << row.diesAtMs;
    }
}

TEST_F(ElmTransport, LostConnectionEndsALongReadWithinASlice)
{
    m_channel->invalidateAfter(1300);
    EXPECT_EQ(receive(10000), TransportStatus::Failure);
    EXPECT_EQ(m_channel->now(), 1500u);
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Invalid connection -> skip"));
}

TEST_F(ElmTransport, MessageOfAConnectionThatDiedMeanwhileIsAFailure)
{
    m_channel->unasked().after(100).loseLink().reply("OK\r>");
    EXPECT_EQ(receive(500), TransportStatus::Failure);
    EXPECT_EQ(m_channel->now(), 100u);
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Invalid connection -> skip"));
}

TEST_F(ElmTransport, ReadWithoutTimeIsAFailureIfNothingIsThere)
{
    EXPECT_EQ(receive(0), TransportStatus::Failure);
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Failed to receive data"));
    EXPECT_EQ(m_channel->now(), 0u);
}

TEST_F(ElmTransport, ReadWithoutTimeTakesWhatIsThere)
{
    m_channel->unasked().reply("OK\r>");
    EXPECT_EQ(receive(0), TransportStatus::Ok);
    EXPECT_EQ(text(m_data), "OK");
}

TEST_F(ElmTransport, LateReplyIsDiscardedByTheNextSend)
{
    m_channel->expect("010C").after(300).reply("NO DATA\r\r>").reply("stray>");
    m_channel->expect("010D").after(30).reply("41 0D 00\r\r>");
    EXPECT_EQ(send("010C"), TransportStatus::Ok);
    EXPECT_EQ(receive(200), TransportStatus::Timeout);
    m_clock.advance(200);
    EXPECT_EQ(send("010D"), TransportStatus::Ok);
    EXPECT_EQ(receive(200), TransportStatus::Ok);
    EXPECT_EQ(text(m_data), "41 0D 00");
    EXPECT_THAT(m_channel->log(), ElementsAre(support::sent(0, "010C\r"), support::timedOut(200),
                                              support::read(400, "NO DATA\r\r"), support::read(400, "stray"),
                                              support::sent(400, "010D\r"), support::read(430, "41 0D 00\r\r")));
}

TEST_F(ElmTransport, ReplyMayComeInPieces)
{
    m_channel->unasked()
        .after(10)
        .reply("SEAR")
        .after(10)
        .reply("CHING...\r")
        .after(600)
        .reply("41 00\r\r")
        .after(5)
        .reply(">");
    EXPECT_EQ(receive(10000), TransportStatus::Ok);
    EXPECT_EQ(text(m_data), "SEARCHING...41 00");
    EXPECT_EQ(m_channel->now(), 625u);
    EXPECT_THAT(m_channel->readTimeouts(), ElementsAre(250, 250, 250));
}

TEST_F(ElmTransport, ScriptedDialoguesTellTheTimeSpentWaiting)
{
    m_channel->expect("ATI").after(40).reply("ELM327 v1.5\r\r>");
    m_channel->expect("ATRV");
    receive(50);
    send("ATI");
    receive(500);
    receive(200);
    send("ATRV");
    receive(300);
    EXPECT_THAT(m_channel->dialogues(),
                ElementsAre(support::Dialogue{"", 50}, support::Dialogue{"ATI", 240}, support::Dialogue{"ATRV", 300}));
}

// Brings a prompt whenever it is asked, and dies after some.
class Flood : public obd::IDataConnection
{
public:
    explicit Flood(int life) : m_left(life) {}
    void setDelimiter(char /*delimiter*/) override {}
    bool isValid() const override { return m_left > 0; }
    bool receive(std::vector<unsigned char>& out, int /*timeoutMs*/) override
    {
        out.clear();
        --m_left;
        ++received;
        return true;
    }
    void send(std::vector<unsigned char> const& /*bytes*/) override { ++sent; }
    void addLogger(obd::IConnectionLogger* /*logger*/) override {}
    void removeLogger(obd::IConnectionLogger* /*logger*/) override {}

    int received = 0;
    int sent = 0;

private:
    int m_left;
};

TEST_F(ElmTransport, AFloodOfPromptsIsNotDrainedForEver)
{
    auto const flood = std::make_shared<Flood>(1000000);
    m_connection = flood;
    EXPECT_EQ(send("ATI"), TransportStatus::Timeout);
    EXPECT_EQ(flood->sent, 0);
    EXPECT_EQ(flood->received, 1001);
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR No end of unasked replies -> skip"));
}

TEST_F(ElmTransport, TheDrainEndsWithItsConnection)
{
    auto const flood = std::make_shared<Flood>(10);
    m_connection = flood;
    EXPECT_EQ(send("ATI"), TransportStatus::Timeout);
    EXPECT_EQ(flood->sent, 0);
    EXPECT_EQ(flood->received, 10);
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Invalid connection -> skip"));
}

} // namespace
