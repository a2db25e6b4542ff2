#include "tests/libobd/adapter/elmscantoolfixture.h"

namespace {

using namespace std::string_view_literals;
using obd::VehicleProtocol;
using support::Dialogue;
using testing::ElementsAre;
using testing::IsEmpty;

class ElmScantool : public ElmScantoolFixture
{
protected:
    obd::ResponseMap m_responses;
};

TEST_F(ElmScantool, FreshOneKnowsNothing)
{
    EXPECT_FALSE(m_device.isEnabled());
    EXPECT_EQ(m_device.device(), "");
    EXPECT_EQ(m_device.description(), "");
    EXPECT_EQ(m_device.identification(), "");
    EXPECT_EQ(m_device.getProtocolDescription(), "");
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolUnknown);
}

TEST_F(ElmScantool, CreatedOneTalksToTheAdapter)
{
    std::string response;
    m_channel->expect("ATI").reply("ELM327 v1.5\r\r>");
    EXPECT_EQ(m_device.execute("ATI", response, 500), Status::Ok);
    EXPECT_EQ(response, "ELM327 v1.5");
    m_channel->expect("0100");
    EXPECT_EQ(m_device.execute("0100", response, 500), Status::NotEnabled);
}

TEST_F(ElmScantool, CloseSendsTheAdapterToSleepAndForgetsIt)
{
    connect();
    m_channel->expect("ATLP");
    m_device.close();
    EXPECT_THAT(dialogues(), ElementsAre(Dialogue{"ATLP", 10}));
    EXPECT_FALSE(m_device.isEnabled());
    EXPECT_EQ(m_device.device(), "");
    EXPECT_EQ(m_device.description(), "");
    EXPECT_EQ(m_device.identification(), "");
    EXPECT_EQ(m_device.getProtocolDescription(), "");
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolUnknown);
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(ElmScantool, ClosedOneSendsNothingMore)
{
    connect();
    support::expectClose(*m_channel);
    m_device.close();
    m_device.close();
    std::string response;
    float volts = 0;
    EXPECT_EQ(m_device.execute("ATRV", response, 500), Status::NotSent);
    EXPECT_EQ(m_device.execute({0x01, 0x0C}, m_responses, 500), Status::NotSent);
    EXPECT_FALSE(m_device.batteryVoltage(volts));
    EXPECT_FALSE(m_device.activateEcu(0x7E8));
    EXPECT_FALSE(m_device.detectVehicle(VehicleProtocol::Iso9141));
    EXPECT_FALSE(m_device.identifyInterface());
    EXPECT_FALSE(m_device.restoreDefaults());
    EXPECT_FALSE(m_device.testConnectivity());
    EXPECT_THAT(sent(), ElementsAre("ATLP\r"));
}

TEST_F(ElmScantool, CloseOnADeadConnectionSendsNothing)
{
    connect();
    m_channel->invalidateAfter(0);
    m_device.close();
    EXPECT_THAT(sent(), IsEmpty());
    EXPECT_FALSE(m_device.isEnabled());
}

TEST_F(ElmScantool, HeadersCountAsOnAfterADisabledDeviceIsTakenUpAgain)
{
    connect();
    support::expectClose(*m_channel);
    m_device.close();
    support::expectInitialize(*m_channel);
    EXPECT_TRUE(m_device.initialize());
    m_channel->expect("0100").reply("7E8 06 41 00 BE 3F A8 13\r\r>");
    EXPECT_EQ(m_device.execute({0x01, 0x00}, m_responses, 500), Status::Unparsed) << "no protocol is known";
    EXPECT_FALSE(m_log.contains("ERROR Headers must be on!"));
}

TEST_F(ElmScantool, TextGoesOutAndComesBackAsItIs)
{
    connect();
    m_channel->expect("at rv ").after(120).reply("12.3 v\r\nat\0ok\r\n\r\n>"sv);
    std::string response;
    EXPECT_EQ(m_device.execute("at rv ", response, 500), Status::Ok);
    EXPECT_EQ(response, "12.3 vatok");
    EXPECT_THAT(dialogues(), ElementsAre(Dialogue{"at rv ", 120}));
}

TEST_F(ElmScantool, TextIsReadOnce)
{
    connect();
    m_channel->expect("ATZ").after(10).reply("ATZ\r>").after(10).reply("ELM327 v1.5\r>");
    std::string response;
    EXPECT_EQ(m_device.execute("ATZ", response, 500), Status::Ok);
    EXPECT_EQ(response, "ATZ");
}

TEST_F(ElmScantool, RequestBytesAreUpperCaseHexadecimal)
{
    connect();
    m_channel->expect("010C").after(60).reply("7E8 04 41 0C 1A F8 \r\r>");
    EXPECT_EQ(m_device.execute({0x01, 0x0C}, m_responses, 500), Status::Ok);
    EXPECT_EQ(m_responses, (obd::ResponseMap{{0x7E8, {0x41, 0x0C, 0x1A, 0xF8}}}));
    EXPECT_THAT(dialogues(), ElementsAre(Dialogue{"010C", 60})) << "one read, to the prompt";
    m_channel->expect("00FFA5").reply("NO DATA\r>");
    EXPECT_EQ(m_device.execute({0x00, 0xFF, 0xA5}, m_responses, 500), Status::NoResponse);
}

TEST_F(ElmScantool, ReplyIsReadByTheProtocolInUse)
{
    connect("3");
    m_channel->expect("010C").reply("48 6B 10 41 0C 1A F8 22 \r\r>");
    EXPECT_EQ(m_device.execute({0x01, 0x0C}, m_responses, 500), Status::Ok);
    EXPECT_EQ(m_responses, (obd::ResponseMap{{0x10, {0x41, 0x0C, 0x1A, 0xF8, 0x22}}}))
        << "the sender is the third header byte; the checksum stays";
}

TEST_F(ElmScantool, NoDataIsAnErrorThoughItsCodeIsZero)
{
    connect();
    m_channel->expect("0101").reply("NO DATA\r\r>");
    EXPECT_EQ(m_device.execute({0x01, 0x01}, m_responses, 500), Status::NoResponse);
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Got error from adapter: 0"));
    EXPECT_THAT(m_responses, IsEmpty());
}

TEST_F(ElmScantool, GoodDataBesideAnErrorIsLost)
{
    connect();
    m_channel->expect("0100").reply("7E8 06 41 00 BE 3F A8 13\rBUFFER FULL\r\r>");
    EXPECT_EQ(m_device.execute({0x01, 0x00}, m_responses, 500), Status::NoResponse);
    EXPECT_THAT(m_responses, IsEmpty());
}

TEST_F(ElmScantool, SilenceIsNoResponseWhileALinkStands)
{
    connect();
    m_channel->expect("0100");
    EXPECT_EQ(m_device.execute({0x01, 0x00}, m_responses, 500), Status::NoResponse);
    EXPECT_THAT(dialogues(), ElementsAre(Dialogue{"0100", 500}));
}

TEST_F(ElmScantool, SilenceIsNotEnabledWithoutALink)
{
    m_channel->expect("0100");
    EXPECT_EQ(m_device.execute({0x01, 0x00}, m_responses, 500), Status::NotEnabled);
}

TEST_F(ElmScantool, HeadersAreAskedForOnlyAfterTheExchange)
{
    m_channel->expect("0100").reply("41 00 BE 3F A8 13\r\r>");
    EXPECT_EQ(m_device.execute({0x01, 0x00}, m_responses, 500), Status::Unparsed);
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Headers must be on!"));
    EXPECT_THAT(m_responses, IsEmpty());
}

TEST_F(ElmScantool, HeadersTurnedOffEndTheReading)
{
    connect();
    m_channel->expect("ATH0").reply("OK\r>");
    EXPECT_TRUE(m_device.turnHeadersOff());
    m_channel->expect("0100").reply("41 00 BE 3F A8 13\r\r>");
    EXPECT_EQ(m_device.execute({0x01, 0x00}, m_responses, 500), Status::Unparsed);
    EXPECT_TRUE(m_log.contains("ERROR Headers must be on!"));
    m_channel->expect("ATH1").reply("OK\r>");
    EXPECT_TRUE(m_device.turnHeadersOn());
    m_channel->expect("0100").reply("7E8 06 41 00 BE 3F A8 13\r\r>");
    EXPECT_EQ(m_device.execute({0x01, 0x00}, m_responses, 500), Status::Ok);
}

TEST_F(ElmScantool, HeadersThatCannotBeTurnedOffStayOn)
{
    connect();
    m_channel->expect("ATH0").reply("no\r>");
    EXPECT_FALSE(m_device.turnHeadersOff());
    m_channel->expect("0100").reply("7E8 06 41 00 BE 3F A8 13\r\r>");
    EXPECT_EQ(m_device.execute({0x01, 0x00}, m_responses, 500), Status::Ok);
}

TEST_F(ElmScantool, ReplyOfBlanksIsUnparsed)
{
    connect();
    m_channel->expect("0100").reply("   \r\r>");
    EXPECT_EQ(m_device.execute({0x01, 0x00}, m_responses, 500), Status::Unparsed);
}

TEST_F(ElmScantool, ReplyOfAnUnknownProtocolIsUnparsed)
{
    connect("0");
    m_channel->expect("0100").reply("7E8 06 41 00 BE 3F A8 13\r\r>");
    EXPECT_EQ(m_device.execute({0x01, 0x00}, m_responses, 500), Status::Unparsed);
    EXPECT_THAT(m_responses, IsEmpty());
}

TEST_F(ElmScantool, EmptyPayloadSendsACarriageReturnAndReadsTheReply)
{
    connect();
    m_channel->expectBytes("\r").reply("7E8 06 41 00 BE 3F A8 13\r\r>");
    EXPECT_EQ(m_device.execute(std::vector<unsigned char>{}, m_responses, 500), Status::Ok);
    EXPECT_EQ(m_responses.count(0x7E8), 1u);
}

TEST_F(ElmScantool, ActivateEcuSetsFilterAndMask)
{
    struct Row
    {
        unsigned int ecu;
        char const* filter;
        char const* mask;
    };
    for (Row const row :
         {Row{0x7E8, "ATCF7E8", "ATCM7FF"}, Row{0x18DAF110, "ATCF18DAF110", "ATCM1FFFFFFF"}, Row{0, "ATCF0", "ATCM1"},
          Row{1, "ATCF1", "ATCM1"}, Row{2, "ATCF2", "ATCM3"}, Row{0x10, "ATCF10", "ATCM1F"},
          Row{0xFFFFFFFF, "ATCFFFFFFFFF", "ATCMFFFFFFFF"}, Row{0x80000000, "ATCF80000000", "ATCMFFFFFFFF"}}) {
        m_channel->expect(row.filter).reply("OK\r>");
        m_channel->expect(row.mask).reply("OK\r>");
        EXPECT_TRUE(m_device.activateEcu(row.ecu)) << row.ecu;
    }
}

TEST_F(ElmScantool, RefusedFilterOrMaskIsLogged)
{
    m_channel->expect("ATCF7E8").reply("?\r>");
    EXPECT_FALSE(m_device.activateEcu(0x7E8)) << "without the mask";
    m_channel->expect("ATCF7E8").reply("ok\r>");
    m_channel->expect("ATCM7FF").reply("no\r>");
    EXPECT_FALSE(m_device.activateEcu(0x7E8));
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to set CAN filter. Response: ",
                                           "FATAL Failed to set CAN mask. Response: NO"));
}

TEST_F(ElmScantool, ExpectedWordIsASubstringOfTheReply)
{
    for (char const* reply : {"ATH1\rOK\r>", "NOK\r>", "o k\r>", "h1 Ok now\r>"}) {
        m_channel->expect("ATH1").reply(reply);
        EXPECT_TRUE(m_device.turnHeadersOn()) << reply;
    }
}

TEST_F(ElmScantool, ExpectedWordMayComeInTwoReads)
{
    m_channel->expect("ATH1").reply("ATH1\r>").after(150).reply("OK\r>");
    EXPECT_TRUE(m_device.turnHeadersOn());
    m_channel->expect("ATH1").reply("O\r>").after(150).reply("K\r>");
    EXPECT_TRUE(m_device.turnHeadersOn());
}

TEST_F(ElmScantool, BatteryVoltageCountsWholesAndTenths)
{
    struct Row
    {
        char const* reply;
        std::optional<float> volts;
    };
    for (Row const& row :
         {Row{"12.3V", 12.3F}, Row{"12.34V", 12.3F}, Row{"12.39", 12.3F}, Row{"0.0V", 0.0F}, Row{"9.8", 9.8F},
          Row{" 14.8 V", 14.8F}, Row{"12V", std::nullopt}, Row{"12", std::nullopt}, Row{"12.V", std::nullopt},
          Row{"12.", std::nullopt}, Row{"V12.3", std::nullopt}, Row{".5V", std::nullopt}, Row{"OK", std::nullopt},
          Row{"99999999999.5V", std::nullopt}, Row{"2147483647.5V", 2147483647.5F}, Row{"", std::nullopt}}) {
        m_channel->expect("ATRV").after(30).reply(std::string(row.reply) + "\r\r>");
        float volts = -1;
        EXPECT_EQ(m_device.batteryVoltage(volts), row.volts.has_value()) << row.reply;
        EXPECT_EQ(volts, row.volts.value_or(-1)) << row.reply;
    }
    EXPECT_THAT(dialogues(), testing::Each(testing::Field(&Dialogue::waitedMs, 230)));
}

TEST_F(ElmScantool, SilentAdapterHasNoVoltage)
{
    m_channel->expect("ATRV");
    float volts = -1;
    EXPECT_FALSE(m_device.batteryVoltage(volts));
    EXPECT_EQ(volts, -1);
    EXPECT_THAT(dialogues(), ElementsAre(Dialogue{"ATRV", 700}));
}

TEST_F(ElmScantool, DiamexHasItsOwnVoltageCommand)
{
    nameAdapter("DIAMEX DXM v1.3");
    m_channel->expect("AT!10").reply("11.9V\r>");
    float volts = 0;
    EXPECT_TRUE(m_device.batteryVoltage(volts));
    EXPECT_EQ(volts, 11.9F);
}

} // namespace
