#include "tests/libobd/adapter/elmscantoolfixture.h"

// Whole bring-ups, adapter by adapter: every byte sent and the time spent in the reads.
namespace {

using obd::VehicleProtocol;
using support::Dialogue;
using testing::ElementsAre;
using testing::IsEmpty;

class AdapterFamilies : public ElmScantoolFixture
{
protected:
    void expectOk(std::initializer_list<char const*> commands, unsigned int afterMs = 0)
    {
        for (char const* command : commands) {
            m_channel->expect(command).after(afterMs).reply("OK\r\r>");
        }
    }
};

TEST_F(AdapterFamilies, Elm15CloneWithItsEchoOnUntilItIsTurnedOff)
{
    m_channel->expect("ATI").after(20).reply("ATI\rELM327 v1.5\r\r>");
    m_channel->expect("AT@1").after(20).reply("AT@1\rOBDII to RS232 Interpreter\r\r>");
    m_channel->expect("AT@2").after(20).reply("AT@2\r?\r\r>");
    m_channel->expect("ATE0").after(20).reply("ATE0\rOK\r\r>");
    expectOk({"ATL0", "ATS0", "ATM0", "ATST64"}, 10);
    m_channel->expect("ATTP0").after(10).reply("OK\r\r>");
    m_channel->expect("0100").after(300).reply("SEARCHING...").after(2000).reply("\r41 00 BE 3F A8 13 \r\r>");
    m_channel->expect("ATDPN").after(10).reply("A6\r\r>");
    m_channel->expect("ATDP").after(10).reply("AUTO, ISO 15765-4 (CAN 11/500)\r\r>");
    m_channel->expect("ATH1").after(10).reply("OK\r\r>");

    EXPECT_TRUE(m_device.initialize());
    EXPECT_FALSE(m_device.isEnabled());
    EXPECT_TRUE(m_device.detectVehicle(VehicleProtocol::Automatic));
    EXPECT_TRUE(m_device.isEnabled());

    EXPECT_EQ(m_device.device(), "ELM327 v1.5");
    EXPECT_EQ(m_device.description(), "OBDII to RS232 Interpreter");
    EXPECT_EQ(m_device.identification(), "");
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolCan11);
    EXPECT_EQ(m_device.getProtocolDescription(), "ISO 15765-4 (CAN 11/500)");
    EXPECT_THAT(m_log.lines(), IsEmpty());
    EXPECT_THAT(m_channel->sentBytes(), ElementsAre("ATI\r", "AT@1\r", "AT@2\r", "ATE0\r", "ATL0\r", "ATS0\r", "ATM0\r",
                                                    "ATST64\r", "ATTP0\r", "0100\r", "ATDPN\r", "ATDP\r", "ATH1\r"));
    EXPECT_THAT(m_channel->dialogues(),
                ElementsAre(Dialogue{"ATI", 220}, Dialogue{"AT@1", 220}, Dialogue{"AT@2", 220 + 50 + 50},
                            Dialogue{"ATE0", 220}, Dialogue{"ATL0", 210}, Dialogue{"ATS0", 210}, Dialogue{"ATM0", 210},
                            Dialogue{"ATST64", 210}, Dialogue{"ATTP0", 210}, Dialogue{"0100", 2300},
                            Dialogue{"ATDPN", 210}, Dialogue{"ATDP", 210}, Dialogue{"ATH1", 210}));
}

TEST_F(AdapterFamilies, Elm12KeepsItsSpaces)
{
    m_channel->expect("ATI").after(30).reply("ATI\r\nELM327 v1.2\r\n\r\n>");
    m_channel->expect("AT@1").after(30).reply("AT@1\r\nOBDII to RS232 Interpreter\r\n\r\n>");
    m_channel->expect("AT@2").after(30).reply("AT@2\r\n?\r\n\r\n>");
    m_channel->expect("ATE0").after(30).reply("ATE0\r\nOK\r\n\r\n>");
    m_channel->expect("ATL0").after(30).reply("OK\r\n\r\n>");
    m_channel->expect("ATM0").after(30).reply("?\r\r>");
    m_channel->expect("ATST64").after(30).reply("OK\r\r>");
    EXPECT_TRUE(m_device.initialize());
    EXPECT_EQ(m_device.device(), "ELM327 v1.2");
    EXPECT_THAT(m_channel->dialogues(),
                ElementsAre(Dialogue{"ATI", 230}, Dialogue{"AT@1", 230}, Dialogue{"AT@2", 330}, Dialogue{"ATE0", 230},
                            Dialogue{"ATL0", 230}, Dialogue{"ATM0", 230}, Dialogue{"ATST64", 230}));
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to set memory off. Response: "));
}

TEST_F(AdapterFamilies, Elm23WithAnIdentifier)
{
    m_channel->expect("ATI").reply("ELM327 v2.3\r\r>");
    m_channel->expect("AT@1").reply("OBDII to RS232 Interpreter\r\r>");
    m_channel->expect("AT@2").reply(" WORKSHOP 0001 \r\r>");
    expectOk({"ATE0", "ATL0", "ATS0", "ATM0", "ATST64"});
    EXPECT_TRUE(m_device.initialize());
    EXPECT_EQ(m_device.device(), "ELM327 v2.3");
    EXPECT_EQ(m_device.identification(), "WORKSHOP 0001");
    EXPECT_THAT(m_channel->dialogues(), ElementsAre(Dialogue{"ATI", 200}, Dialogue{"AT@1", 200}, Dialogue{"AT@2", 300},
                                                    Dialogue{"ATE0", 200}, Dialogue{"ATL0", 200}, Dialogue{"ATS0", 200},
                                                    Dialogue{"ATM0", 200}, Dialogue{"ATST64", 200}));
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(AdapterFamilies, ObdKey130)
{
    m_channel->expect("ATI").after(5).reply("OBDKey 1.30\r\r>");
    m_channel->expect("AT@1").after(5).reply("OBDKey Bluetooth\r\r>");
    m_channel->expect("AT@2").after(5).reply("?\r\r>");
    expectOk({"ATE0", "ATL0", "ATS0", "ATM0", "ATST64", "ATSP3"}, 5);
    m_channel->expect("0100").after(3000).reply("BUS INIT: ...OK\r41 00 BE 3E A8 11 \r\r>");
    m_channel->expect("ATDPN").after(5).reply("3\r\r>");
    m_channel->expect("ATDP").after(5).reply("ISO 9141-2\r\r>");
    m_channel->expect("ATH1").after(5).reply("OK\r\r>");
    EXPECT_TRUE(m_device.initialize());
    EXPECT_TRUE(m_device.detectVehicle(VehicleProtocol::Iso9141));
    EXPECT_EQ(m_device.device(), "OBDKey 1.30");
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolIso9141);
    EXPECT_EQ(m_device.getProtocolDescription(), "ISO 9141-2");
    EXPECT_THAT(m_channel->dialogues(),
                ElementsAre(Dialogue{"ATI", 205}, Dialogue{"AT@1", 205}, Dialogue{"AT@2", 5 + 200 + 500 + 100},
                            Dialogue{"ATE0", 205}, Dialogue{"ATL0", 205}, Dialogue{"ATS0", 205}, Dialogue{"ATM0", 205},
                            Dialogue{"ATST64", 205}, Dialogue{"ATSP3", 205}, Dialogue{"0100", 3000},
                            Dialogue{"ATDPN", 205}, Dialogue{"ATDP", 205}, Dialogue{"ATH1", 205}))
        << "never ATTP; the third read of the identifier, since it is empty with the echo off";
}

TEST_F(AdapterFamilies, Diamex)
{
    m_channel->expect("ATI").after(5).reply("ATI\rDIAMEX DXM v1.3\r\r>");
    m_channel->expect("AT!01").after(5).reply("AT!01\rDIAMEX GmbH \r\r>");
    m_channel->expect("AT!00").after(5).reply("AT!00\rS/N 12345\r\r>");
    m_channel->expect("ATE0").after(5).reply("ATE0\rOK\r\r>");
    expectOk({"ATL0", "ATS0", "ATM0", "ATST64"}, 5);
    m_channel->expect("ATP5").after(5).reply("5=ISO 14230 FAST\r\r>");
    m_channel->expect("0100").after(700).reply("41 00 BE 3E A8 11 \r\r>");
    m_channel->expect("ATN").after(5).reply("5\r\r>");
    m_channel->expect("ATDP").after(5).reply("ISO 14230-4 (KWP FAST)\r\r>");
    m_channel->expect("ATH1").after(5).reply("OK\r\r>");
    EXPECT_TRUE(m_device.initialize());
    EXPECT_TRUE(m_device.detectVehicle(VehicleProtocol::Iso14230Fast));
    EXPECT_EQ(m_device.device(), "DIAMEX DXM v1.3");
    EXPECT_EQ(m_device.description(), "DIAMEX GmbH");
    EXPECT_EQ(m_device.identification(), "S/N 12345");
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolIso14230);
    EXPECT_THAT(m_channel->dialogues(),
                ElementsAre(Dialogue{"ATI", 205}, Dialogue{"AT!01", 205}, Dialogue{"AT!00", 305}, Dialogue{"ATE0", 205},
                            Dialogue{"ATL0", 205}, Dialogue{"ATS0", 205}, Dialogue{"ATM0", 205},
                            Dialogue{"ATST64", 205}, Dialogue{"ATP5", 205}, Dialogue{"0100", 700}, Dialogue{"ATN", 205},
                            Dialogue{"ATDP", 205}, Dialogue{"ATH1", 205}));
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(AdapterFamilies, Kiwi)
{
    m_channel->expect("ATI").reply("PLXKIWI 1.0\r\r>");
    m_channel->expect("AT@1").reply("PLX Devices\r\r>");
    m_channel->expect("AT@2").reply("1\r\r>");
    expectOk({"ATE0", "ATL0", "ATM0", "ATST64", "ATSP0"});
    m_channel->expect("0100").reply("SEARCHING...\r41 00 BE 3E A8 11 \r\r>");
    m_channel->expect("ATDPN").reply("A2\r\r>");
    m_channel->expect("ATDP").reply("AUTO, SAE J1850 VPW\r\r>");
    m_channel->expect("ATH1").reply("OK\r\r>");
    EXPECT_TRUE(m_device.initialize());
    EXPECT_TRUE(m_device.detectVehicle(VehicleProtocol::Automatic));
    EXPECT_EQ(m_device.device(), "PLXKIWI 1.0");
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolJ1850);
    EXPECT_EQ(m_device.getProtocolDescription(), "SAE J1850 VPW");
    EXPECT_THAT(m_channel->dialogues(),
                ElementsAre(Dialogue{"ATI", 200}, Dialogue{"AT@1", 200}, Dialogue{"AT@2", 300}, Dialogue{"ATE0", 200},
                            Dialogue{"ATL0", 200}, Dialogue{"ATM0", 200}, Dialogue{"ATST64", 200},
                            Dialogue{"ATSP0", 200}, Dialogue{"0100", 0}, Dialogue{"ATDPN", 200}, Dialogue{"ATDP", 200},
                            Dialogue{"ATH1", 200}));
}

TEST_F(AdapterFamilies, ObdProsIsAnUnknownInterfaceWithoutAVersion)
{
    m_channel->expect("ATI").reply("OBDPros LLC v2.1\r\r>");
    expectOk({"AT@1", "AT@2", "ATE0", "ATL0", "ATM0", "ATST64", "ATSP6"});
    m_channel->expect("0100").reply("41 00 BE 3E A8 11 \r\r>");
    m_channel->expect("ATDPN").reply("6\r\r>");
    m_channel->expect("ATDP").reply("ISO 15765-4 (CAN 11/500)\r\r>");
    m_channel->expect("ATH1").reply("OK\r\r>");
    m_channel->expect("ATSCS6").reply("OK\r");
    EXPECT_TRUE(m_device.initialize());
    EXPECT_TRUE(m_device.detectVehicle(VehicleProtocol::Iso15765Can11Bit500));
    EXPECT_EQ(m_device.device(), "OBDPros LLC v2.1");
    EXPECT_THAT(m_channel->dialogues(),
                ElementsAre(Dialogue{"ATI", 200}, Dialogue{"AT@1", 200}, Dialogue{"AT@2", 300}, Dialogue{"ATE0", 200},
                            Dialogue{"ATL0", 200}, Dialogue{"ATM0", 200}, Dialogue{"ATST64", 200},
                            Dialogue{"ATSP6", 200}, Dialogue{"0100", 0}, Dialogue{"ATDPN", 200}, Dialogue{"ATDP", 200},
                            Dialogue{"ATH1", 200}));
    EXPECT_TRUE(m_device.changeBaudRate(115200)) << "yet its own rate command is known";
}

TEST_F(AdapterFamilies, UnknownAdapterIsAccepted)
{
    m_channel->expect("ATI").reply("ATI\rUniScan 4 rev v9\r\r>");
    m_channel->expect("AT@1").reply("AT@1\r?\r\r>");
    m_channel->expect("AT@2").reply("AT@2\r?\r\r>");
    m_channel->expect("ATE0").reply("ATE0\rOK\r\r>");
    expectOk({"ATL0", "ATM0", "ATST64", "ATSP0"});
    m_channel->expect("0100").reply("41 00 BE 3E A8 11 \r\r>");
    m_channel->expect("ATDPN").reply("A7\r\r>");
    m_channel->expect("ATDP").reply("AUTO,ISO 15765-4 (CAN 29/500)\r\r>");
    m_channel->expect("ATH1").reply("OK\r\r>");
    EXPECT_TRUE(m_device.initialize());
    EXPECT_TRUE(m_device.detectVehicle(VehicleProtocol::Automatic));
    EXPECT_EQ(m_device.device(), "UniScan 4 rev v9");
    EXPECT_EQ(m_device.description(), "");
    EXPECT_EQ(m_device.identification(), "");
    EXPECT_EQ(m_device.getProtocol(), obd::ObdProtocolCan29);
    EXPECT_THAT(m_log.lines(), IsEmpty());
    EXPECT_THAT(m_channel->dialogues(),
                ElementsAre(Dialogue{"ATI", 200}, Dialogue{"AT@1", 200}, Dialogue{"AT@2", 300}, Dialogue{"ATE0", 200},
                            Dialogue{"ATL0", 200}, Dialogue{"ATM0", 200}, Dialogue{"ATST64", 200},
                            Dialogue{"ATSP0", 200}, Dialogue{"0100", 0}, Dialogue{"ATDPN", 200}, Dialogue{"ATDP", 200},
                            Dialogue{"ATH1", 200}))
        << "an adapter of no known version keeps its spaces";
}

TEST_F(AdapterFamilies, SilentAdapterIsAskedForItsNameAndNothingElse)
{
    m_channel->expect("ATI");
    EXPECT_FALSE(m_device.initialize());
    EXPECT_THAT(m_channel->dialogues(), ElementsAre(Dialogue{"ATI", 1700}));
    EXPECT_THAT(m_channel->readTimeouts(), ElementsAre(250, 250, 250, 250, 250, 250, 200));
    EXPECT_EQ(m_device.device(), "");
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(AdapterFamilies, VersionDecidesWhetherSpacesAreTurnedOff)
{
    struct Row
    {
        char const* name;
        bool sent;
    };
    for (Row const row :
         {Row{"ELM327 v1.2", false}, Row{"ELM327 v1.3a", true}, Row{"ELM327 v2.0", true}, Row{"ELM327", false},
          Row{"ELM327 v1.0", false}, Row{"ELM327 v10.0", true}, Row{"OBDKEY 1.30", true}, Row{"obdkey 1.20", false},
          Row{"DIAMEX DXM v1.2", false}, Row{"DIAMEX v2.0 v1.3", true}, Row{"DIAMEX v2.0", false},
          Row{"PLXKiwi 1.3", true}, Row{"PLX Kiwi 1.3", false}, Row{"STN1170 v4.0", false}}) {
        support::FakeClock clock;
        auto channel = std::make_shared<support::ScriptedChannel>(clock);
        channel->expect("ATI").reply(std::string(row.name) + "\r\r>");
        for (char const* command : {"AT@1", "AT@2", "AT!00", "AT!01", "ATE0", "ATL0", "ATS0", "ATM0", "ATST64"}) {
            channel->whenever(command).reply("OK\r>");
        }
        obd::ElmScantool device(channel);
        EXPECT_TRUE(device.initialize()) << row.name;
        EXPECT_EQ(testing::Value(channel->sentBytes(), testing::Contains("ATS0\r")), row.sent) << row.name;
    }
}

} // namespace
