#include "tests/libobd/adapter/elmscantoolfixture.h"

#include <obd/connectionprotocol.h>

namespace {

using obd::VehicleProtocol;
using support::Dialogue;
using testing::ElementsAre;
using testing::IsEmpty;

class ProtocolSetup : public ElmScantoolFixture
{
protected:
    // The dialogue that follows a working probe.
    void expectIdentity(std::string const& number, std::string const& description)
    {
        m_channel->expect("ATDPN").reply(number + "\r\r>");
        m_channel->expect("ATDP").reply(description + "\r\r>");
    }
    void expectProbe() { m_channel->expect("0100").reply("41 00 BE 3E A8 11 \r\r>"); }
    void expectHeaders() { m_channel->expect("ATH1").reply("OK\r\r>"); }

    // Sets protocol 6 up on an adapter that says so about the protocol.
    bool detectWith(std::string const& number, std::string const& description)
    {
        m_channel->expect("ATSP6").reply("OK\r\r>");
        expectProbe();
        expectIdentity(number, description);
        expectHeaders();
        return m_device.detectVehicle(VehicleProtocol::Iso15765Can11Bit500);
    }
};

TEST_F(ProtocolSetup, ChosenProtocolGetsOneAttempt)
{
    nameAdapter("ELM327 v1.5");
    m_channel->expect("ATTP3").reply("OK\r\r>");
    m_channel->expect("0100").after(5000).reply("UNABLE TO CONNECT\r\r>");
    EXPECT_FALSE(m_device.detectVehicle(VehicleProtocol::Iso9141));
    EXPECT_THAT(dialogues(), ElementsAre(Dialogue{"ATTP3", 200}, Dialogue{"0100", 5000}));
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Got error from adapter: 12", "FATAL empty response to 0100",
                                           "FATAL failed to detect protocol"));
    EXPECT_FALSE(m_device.isEnabled());
}

TEST_F(ProtocolSetup, ProbeIsOneReadOfTenSeconds)
{
    m_channel->expect("ATSP6").reply("OK\r\r>");
    m_channel->expect("0100");
    EXPECT_FALSE(m_device.detectVehicle(VehicleProtocol::Iso15765Can11Bit500));
    EXPECT_THAT(dialogues(), ElementsAre(Dialogue{"ATSP6", 200}, Dialogue{"0100", 10000}));
}

TEST_F(ProtocolSetup, SearchGoesThroughTheProtocolsTwiceEach)
{
    nameAdapter("ELM327 v1.5");
    for (char const* command : {"ATTP0", "ATTP1", "ATTP1", "ATTP2", "ATTP2"}) {
        m_channel->expect(command).reply("OK\r\r>");
        m_channel->expect("0100").after(100).reply("NO DATA\r\r>");
    }
    m_channel->expect("ATTP3").reply("OK\r\r>");
    expectProbe();
    expectIdentity("3", "ISO 9141-2");
    expectHeaders();
    EXPECT_TRUE(m_device.detectVehicle(VehicleProtocol::Automatic));
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolIso9141);
    EXPECT_TRUE(m_device.isEnabled());
    EXPECT_EQ(m_device.vehicleProtocol(), VehicleProtocol::Iso9141);
    EXPECT_THAT(sent(), ElementsAre("ATTP0\r", "0100\r", "ATTP1\r", "0100\r", "ATTP1\r", "0100\r", "ATTP2\r", "0100\r",
                                    "ATTP2\r", "0100\r", "ATTP3\r", "0100\r", "ATDPN\r", "ATDP\r", "ATH1\r"));
}

TEST_F(ProtocolSetup, SecondAttemptMayFindTheVehicle)
{
    for (char const* command : {"ATSP0", "ATSP1"}) {
        m_channel->expect(command).reply("OK\r\r>");
        m_channel->expect("0100").reply("NO DATA\r\r>");
    }
    m_channel->expect("ATSP1").reply("OK\r\r>");
    expectProbe();
    expectIdentity("1", "SAE J1850 PWM");
    expectHeaders();
    EXPECT_TRUE(m_device.detectVehicle(VehicleProtocol::Automatic));
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolJ1850);
}

TEST_F(ProtocolSetup, SilentVehicleIsGivenUpAfterNineteenAttempts)
{
    std::vector<std::string> expected;
    for (int number : {0, 1, 1, 2, 2, 3, 3, 4, 4, 5, 5, 6, 6, 7, 7, 8, 8, 9, 9}) {
        std::string const command = "ATSP" + std::to_string(number);
        m_channel->expect(command).reply("OK\r\r>");
        m_channel->expect("0100");
        expected.insert(expected.end(), {command + "\r", "0100\r"});
    }
    EXPECT_FALSE(m_device.detectVehicle(VehicleProtocol::Automatic));
    EXPECT_EQ(sent(), expected);
    EXPECT_EQ(m_channel->now(), 19u * 10200u);
    EXPECT_THAT(m_log.lines(), testing::SizeIs(19));
    EXPECT_THAT(m_log.lines(), testing::Each("FATAL empty response to 0100")) << "no line marks the end";
}

TEST_F(ProtocolSetup, SearchOnADeadConnectionRunsThroughQuickly)
{
    m_channel->expect("ATSP0").reply("OK\r\r>");
    m_channel->expect("0100").after(400).loseLink();
    EXPECT_FALSE(m_device.detectVehicle(VehicleProtocol::Automatic));
    EXPECT_THAT(sent(), ElementsAre("ATSP0\r", "0100\r"));
    EXPECT_EQ(m_channel->now(), 700u);
}

TEST_F(ProtocolSetup, RefusedProtocolCommandEndsTheAttempt)
{
    m_channel->expect("ATSP7").reply("what\r\r>");
    EXPECT_FALSE(m_device.detectVehicle(VehicleProtocol::Iso15765Can29Bit500));
    EXPECT_THAT(m_log.lines(),
                ElementsAre("FATAL Failed to set set protocol. Response: WHAT", "FATAL failed to detect protocol"));
}

TEST_F(ProtocolSetup, ElmThatRefusesToTryIsToldToSet)
{
    nameAdapter("ELM327 v1.5");
    m_channel->expect("ATTP6").reply("?\r\r>");
    m_channel->expect("ATSP6").reply("OK\r\r>");
    expectProbe();
    expectIdentity("6", "ISO 15765-4 (CAN 11/500)");
    expectHeaders();
    EXPECT_TRUE(m_device.detectVehicle(VehicleProtocol::Iso15765Can11Bit500));
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to set try protocol. Response: "));
}

TEST_F(ProtocolSetup, OtherFamiliesAreNeverToldToTry)
{
    for (char const* name : {"OBDKey 1.3", "PLXKIWI 1.0", "OBDPros v2", "UniScan 4", "elm327 v1.5"}) {
        auto channel = std::make_shared<support::ScriptedChannel>(m_clock);
        obd::ElmScantool device(channel);
        channel->expect("ATI").reply(std::string(name) + "\r>");
        channel->expect("AT@1");
        channel->expect("ATSP6");
        EXPECT_TRUE(device.identifyInterface());
        EXPECT_FALSE(device.detectVehicle(VehicleProtocol::Iso15765Can11Bit500)) << name;
    }
}

TEST_F(ProtocolSetup, EveryProtocolNumberGoesOut)
{
    for (int number = 0; number <= 9; ++number) {
        auto channel = std::make_shared<support::ScriptedChannel>(m_clock);
        obd::ElmScantool device(channel);
        channel->expect("ATSP" + std::to_string(number)).reply("OK\r>");
        channel->expect("0100").reply("41 00 00 00 00 00\r>");
        channel->expect("ATDPN").reply(std::to_string(number) + "\r>");
        channel->expect("ATDP").reply("x\r>");
        channel->expect("ATH1").reply("OK\r>");
        auto const protocol = static_cast<VehicleProtocol>(number);
        EXPECT_TRUE(device.detectVehicle(protocol)) << number;
        EXPECT_EQ(device.getProtocol(), obd::toObdProtocol(protocol)) << number;
    }
}

TEST_F(ProtocolSetup, DiamexAnswersWithTheNumber)
{
    nameAdapter("DIAMEX DXM v1.3");
    m_channel->expect("ATP6").after(30).reply("atp6 6 = CAN\r\r>");
    expectProbe();
    m_channel->expect("ATN").reply("ATN\r6\r\r>");
    m_channel->expect("ATDP").reply("ISO 15765-4\r\r>");
    expectHeaders();
    EXPECT_TRUE(m_device.detectVehicle(VehicleProtocol::Iso15765Can11Bit500));
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolCan11);
    EXPECT_THAT(m_log.lines(), IsEmpty());
    EXPECT_EQ(dialogues().front(), (Dialogue{"ATP6", 230}));
}

TEST_F(ProtocolSetup, DiamexMayAnswerAuto)
{
    nameAdapter("DIAMEX DXM v1.3");
    m_channel->expect("ATP0").reply("Auto\r\r>");
    expectProbe();
    m_channel->expect("ATN").reply("6\r\r>");
    m_channel->expect("ATDP").reply("ISO 15765-4\r\r>");
    expectHeaders();
    EXPECT_TRUE(m_device.detectVehicle(VehicleProtocol::Automatic));
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to find 0=, looking for AUTO"));
}

TEST_F(ProtocolSetup, DiamexThatAnswersOtherwiseHasFailed)
{
    nameAdapter("DIAMEX DXM v1.3");
    m_channel->expect("ATP6").reply("5=ISO 14230\r\r>");
    EXPECT_FALSE(m_device.detectVehicle(VehicleProtocol::Iso15765Can11Bit500));
    EXPECT_THAT(m_log.lines(),
                ElementsAre("FATAL Failed to find 6=, looking for AUTO",
                            "FATAL Failed to set protocol. Response: 5=ISO14230", "FATAL failed to detect protocol"));
}

TEST_F(ProtocolSetup, DiamexUnderAnElmNameIsAskedToTryInItsOwnWay)
{
    nameAdapter("ELM327 DIAMEX v1.5");
    m_channel->expect("ATPA6").reply("OK\r\r>");
    m_channel->expect("ATP6").reply("6=CAN\r\r>");
    m_channel->expect("0100");
    EXPECT_FALSE(m_device.detectVehicle(VehicleProtocol::Iso15765Can11Bit500));
    EXPECT_TRUE(m_log.contains("FATAL Failed to set try protocol. Response: OK"));
    m_channel->expect("ATPA6").reply("6=CAN\r\r>");
    m_channel->expect("0100");
    EXPECT_FALSE(m_device.detectVehicle(VehicleProtocol::Iso15765Can11Bit500));
}

TEST_F(ProtocolSetup, NumberMayFollowAnA)
{
    EXPECT_TRUE(detectWith("A6", "ISO 15765-4 (CAN 11/500)"));
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolCan11);
}

TEST_F(ProtocolSetup, NumberAloneIsTaken)
{
    EXPECT_TRUE(detectWith("6", "ISO 15765-4 (CAN 11/500)"));
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolCan11);
}

TEST_F(ProtocolSetup, FirstDigitCounts)
{
    EXPECT_TRUE(detectWith("atdpn\r> a 98", "x"));
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolCan29);
}

TEST_F(ProtocolSetup, DigitZeroIsASuccessWithAnUnknownProtocol)
{
    EXPECT_TRUE(detectWith("0", "AUTO"));
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolUnknown);
    EXPECT_TRUE(m_device.isEnabled());
}

TEST_F(ProtocolSetup, LettersOfTheFurtherProtocolsAreNoNumber)
{
    for (char const* number : {"AB", "A", "B", "C", ""}) {
        m_log.clear();
        m_channel->expect("ATSP6").reply("OK\r\r>");
        expectProbe();
        m_channel->expect("ATDPN").reply(std::string(number) + "\r\r>");
        EXPECT_FALSE(m_device.detectVehicle(VehicleProtocol::Iso15765Can11Bit500)) << number;
        EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to query protocol number: ",
                                               "FATAL Failed to identify protocol", "FATAL failed to detect protocol"));
    }
}

TEST_F(ProtocolSetup, DescriptionIsInTheAdaptersWords)
{
    struct Row
    {
        char const* reply;
        char const* description;
    };
    for (Row const row :
         {Row{"AUTO, ISO 15765-4 (CAN 11/500)", "ISO 15765-4 (CAN 11/500)"},
          Row{"AUTO,ISO 15765-4 (CAN 11/500)", "ISO 15765-4 (CAN 11/500)"}, Row{"ATDP\rSAE J1850 VPW", "SAE J1850 VPW"},
          Row{"ISO 9141-2", "ISO 9141-2"}, Row{"AUTO", "AUTO"}, Row{"AUTO,", "AUTO"}, Row{"", "AUTO"}, Row{"?", "AUTO"},
          Row{"AUTO, ", ""}, Row{"Auto, KWP", "Auto KWP"}}) {
        EXPECT_TRUE(detectWith("6", row.reply)) << row.reply;
        EXPECT_EQ(m_device.getProtocolDescription(), row.description) << row.reply;
    }
}

TEST_F(ProtocolSetup, RefusedHeadersEndTheAttemptAndTheSearchGoesOn)
{
    nameAdapter("ELM327 v1.5");
    m_channel->expect("ATTP0").reply("OK\r\r>");
    expectProbe();
    expectIdentity("A6", "AUTO, ISO 15765-4 (CAN 11/500)");
    m_channel->expect("ATH1").reply("?\r\r>");
    m_channel->expect("ATTP1").reply("OK\r\r>");
    m_channel->expect("0100").loseLink();
    EXPECT_FALSE(m_device.detectVehicle(VehicleProtocol::Automatic));
    EXPECT_FALSE(m_device.isEnabled());
    EXPECT_THAT(m_log.lines(), testing::IsSupersetOf(
                                   {"FATAL Failed to set headers on. Response: ", "FATAL Failed to turn headers on"}));
}

TEST_F(ProtocolSetup, RefusedHeadersLeaveTheDeviceWithoutALink)
{
    m_channel->expect("ATSP6").reply("OK\r\r>");
    expectProbe();
    expectIdentity("6", "ISO 15765-4 (CAN 11/500)");
    m_channel->expect("ATH1").reply("?\r\r>");
    EXPECT_FALSE(m_device.detectVehicle(VehicleProtocol::Iso15765Can11Bit500));
    EXPECT_FALSE(m_device.isEnabled());
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolCan11) << "what the adapter reported last stays";
    EXPECT_EQ(m_device.getProtocolDescription(), "ISO 15765-4 (CAN 11/500)");
}

TEST_F(ProtocolSetup, NewAttemptTakesTheLinkDown)
{
    connect();
    EXPECT_TRUE(m_device.isEnabled());
    m_channel->expect("ATTP3").reply("?\r\r>");
    m_channel->expect("ATSP3").reply("?\r\r>");
    EXPECT_FALSE(m_device.detectVehicle(VehicleProtocol::Iso9141));
    EXPECT_FALSE(m_device.isEnabled());
}

TEST_F(ProtocolSetup, SearchNoticeAloneCountsAsAnAnswer)
{
    m_channel->expect("ATSP6").reply("OK\r\r>");
    m_channel->expect("0100").reply("SEARCHING...\r\r>");
    expectIdentity("6", "ISO 15765-4 (CAN 11/500)");
    expectHeaders();
    EXPECT_TRUE(m_device.detectVehicle(VehicleProtocol::Iso15765Can11Bit500));
}

} // namespace
