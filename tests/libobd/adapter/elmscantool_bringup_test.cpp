#include "tests/libobd/adapter/elmscantoolfixture.h"

#include <atomic>
#include <thread>

namespace {

using namespace std::string_view_literals;
using obd::VehicleProtocol;
using support::Dialogue;
using testing::ElementsAre;
using testing::IsEmpty;

class BringUp : public ElmScantoolFixture
{
protected:
    // The replies to what every configuration sends, the echo off.
    void expectOk(std::initializer_list<char const*> commands, unsigned int afterMs = 0)
    {
        for (char const* command : commands) {
            m_channel->expect(command).after(afterMs).reply("OK\r\r>");
        }
    }
};

TEST_F(BringUp, ReadsOfTheIdentificationAreGivenTheirTimes)
{
    m_channel->expect("ATI").reply("ELM327 v1.5\r\r>");
    m_channel->expect("AT@1").reply("OBDII to RS232 Interpreter\r\r>");
    m_channel->expect("AT@2");
    m_channel->expect("ATE0");
    EXPECT_FALSE(m_device.initialize());
    EXPECT_THAT(m_channel->readTimeouts(), ElementsAre(250, 200,                // ATI: 1500 (answered), 200
                                                       250, 200,                // AT@1: 500 (answered), 200
                                                       250, 250, 200, 250, 250, // AT@2: 500, 200, 500
                                                       50, 50, 250, 250, 200)); // drain, ATE0: 500, 200
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to set echo off. Response: "));
}

TEST_F(BringUp, AdapterThatOnlyAsksBackFailsAtOnce)
{
    m_channel->expect("ATI").after(5).reply("?\r\r>");
    EXPECT_FALSE(m_device.initialize());
    EXPECT_THAT(m_channel->dialogues(), ElementsAre(Dialogue{"ATI", 205}));
}

TEST_F(BringUp, NameWithTheLettersOfAnErrorIsNoName)
{
    m_channel->expect("ATI").reply("Power Reader v2.0\r\r>");
    EXPECT_FALSE(m_device.initialize());
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Got error from adapter: 7"));
}

TEST_F(BringUp, GarbageIsTakenForAnUnknownAdapterUntilTheEchoCannotBeTurnedOff)
{
    m_channel->expect("ATI").reply("\xFE\xFE\x81>");
    for (char const* command : {"AT@1", "AT@2", "ATE0"}) {
        m_channel->expect(command).reply("\x8E\xFE>");
    }
    EXPECT_FALSE(m_device.initialize());
    EXPECT_EQ(m_device.device(), "\xFE\xFE\x81");
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to set echo off. Response: \x8E\xFE"));
}

TEST_F(BringUp, EchoThatStaysOnEndsTheConfiguration)
{
    m_channel->expect("ATI").reply("ELM327 v1.5\r\r>");
    expectOk({"AT@1", "AT@2"});
    m_channel->expect("ATE0").reply("ate0\r?\r\r>");
    EXPECT_FALSE(m_device.initialize());
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to set echo off. Response: "));
}

TEST_F(BringUp, LineFeedsThatStayOnEndTheConfiguration)
{
    m_channel->expect("ATI").reply("ELM327 v1.5\r\r>");
    expectOk({"AT@1", "AT@2", "ATE0"});
    m_channel->expect("ATL0").reply("no way\r\r>");
    EXPECT_FALSE(m_device.initialize());
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to set linefeed off. Response: NOWAY"));
}

TEST_F(BringUp, SpacesMemoryAndTimeoutMayBeRefused)
{
    m_channel->expect("ATI").reply("ELM327 v1.5\r\r>");
    expectOk({"AT@1", "AT@2", "ATE0", "ATL0"});
    m_channel->expect("ATS0").reply("a\r>");
    m_channel->expect("ATM0").reply("b\r>");
    m_channel->expect("ATST64").reply("c\r>");
    EXPECT_TRUE(m_device.initialize());
    EXPECT_THAT(m_log.lines(),
                ElementsAre("FATAL Failed to set spaces off. Response: A",
                            "FATAL Failed to set memory off. Response: B", "FATAL Failed to set timeout. Response: C"));
}

TEST_F(BringUp, DrainTakesWhatComesLateBeforeTheEchoIsTurnedOff)
{
    m_channel->expect("ATI").reply("ELM327 v1.5\r\r>");
    m_channel->expect("AT@1").reply("a\r>");
    m_channel->expect("AT@2").reply("b\r>").after(230).reply("late\r>").after(30).reply("later\r>");
    m_channel->expect("ATE0").after(20);
    EXPECT_FALSE(m_device.initialize());
    EXPECT_EQ(m_device.identification(), "b");
    std::vector<support::ChannelEvent> const log = m_channel->log();
    ASSERT_GE(log.size(), 4u);
    EXPECT_THAT(log, testing::IsSupersetOf({support::read(400 + 230, "late\r"), support::read(400 + 260, "later\r"),
                                            support::sent(400 + 260, "ATE0\r")}));
    EXPECT_EQ(m_channel->delimiter(), '>');
}

TEST_F(BringUp, IdentifierMayComeWithTheThirdRead)
{
    m_channel->expect("ATI").reply("ELM327 v1.5\r\r>");
    m_channel->expect("AT@1").reply("a\r>");
    m_channel->expect("AT@2").after(1000).reply("SLOW ONE\r>");
    m_channel->expect("ATE0");
    EXPECT_FALSE(m_device.initialize());
    EXPECT_EQ(m_device.identification(), "SLOW ONE");
}

TEST_F(BringUp, InitializeTakesADisabledDeviceUpAgain)
{
    support::expectClose(*m_channel);
    m_device.close();
    support::expectInitialize(*m_channel);
    EXPECT_TRUE(m_device.initialize());
}

TEST_F(BringUp, ResetOptionRestoresTheSettingsAndRestartsTheAdapter)
{
    m_channel->expect("ATD").after(10).reply("OK\r\r>").after(300).reply("stray>");
    m_channel->expect("ATZ").after(800).reply("ATZ\r\r\rELM327 v1.5\r\r>");
    EXPECT_TRUE(m_device.restoreDefaults());
    EXPECT_TRUE(m_device.resetInterface());
    EXPECT_EQ(m_device.device(), "ELM327 v1.5");
    EXPECT_THAT(m_channel->dialogues(), ElementsAre(Dialogue{"ATD", 210 + 100}, Dialogue{"ATZ", 800 + 1000 + 500}))
        << "the flush before the reset ends with the stray prompt";
}

TEST_F(BringUp, ResetReadsInThreeSteps)
{
    m_channel->expect("ATZ");
    EXPECT_FALSE(m_device.resetInterface());
    EXPECT_THAT(m_channel->dialogues(), ElementsAre(Dialogue{"", 200}, Dialogue{"ATZ", 3000}));
}

TEST_F(BringUp, RefusedRestoreIsLogged)
{
    m_channel->expect("ATD").reply("what\r>");
    EXPECT_FALSE(m_device.restoreDefaults());
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to restore default settings. Response: WHAT"));
}

TEST_F(BringUp, NameIsReadWithoutTheCommandsAndOk)
{
    struct Row
    {
        std::string_view reply;
        char const* name;
    };
    for (Row const& row : {Row{"ATZ\r\r\rELM327 v1.5\r\r>", "ELM327 v1.5"}, Row{"ATIELM327 v1.5OK>", "ELM327 v1.5"},
                           Row{"\xFC\r\rATI\rELM327 v1.5\r\r>", "ELM327 v1.5"},
                           Row{"\xFC\rELM327 v1.5\r\r>", "\xFC"
                                                         "ELM327 v1.5"},
                           Row{"\0\0ELM327 v2.1\r\n\r\n>"sv, "ELM327 v2.1"}, Row{" ELM327 v1.5 \r>", " ELM327 v1.5 "},
                           Row{"ATZ ATI ELM327\r>", " ELM327"}}) {
        auto channel = std::make_shared<support::ScriptedChannel>(m_clock);
        channel->expect("ATI").reply(row.reply);
        channel->whenever("AT@1");
        obd::ElmScantool device(channel);
        EXPECT_TRUE(device.identifyInterface()) << row.reply;
        EXPECT_EQ(device.device(), row.name) << row.reply;
    }
}

TEST_F(BringUp, NameMayComeInTwoReads)
{
    m_channel->expect("ATI").after(10).reply("ATI\r>").after(100).reply("ELM327 v1.5\r\r>");
    m_channel->expect("AT@1").reply("OBDII\r>");
    EXPECT_TRUE(m_device.identifyInterface());
    EXPECT_EQ(m_device.device(), "ELM327 v1.5");
}

TEST_F(BringUp, CommandWordAloneIsNoName)
{
    m_channel->expect("ATI").reply("ATI\rOK\r\r>");
    EXPECT_FALSE(m_device.identifyInterface());
    EXPECT_EQ(m_device.device(), "");
}

TEST_F(BringUp, ConnectivityIsTriedTwice)
{
    m_channel->expect("ATI").after(5).reply("?\r\r>");
    m_channel->expect("ATI").after(5).reply("?\r\r>");
    EXPECT_FALSE(m_device.testConnectivity());
    m_channel->expect("ATI");
    m_channel->expect("ATI").after(5).reply("ABCDE\r\r>");
    EXPECT_TRUE(m_device.testConnectivity());
    m_channel->expect("ATI").after(5).reply("ABCDE\r\r>");
    EXPECT_TRUE(m_device.testConnectivity());
    EXPECT_THAT(m_channel->dialogues(), ElementsAre(Dialogue{"ATI", 5}, Dialogue{"ATI", 5}, Dialogue{"ATI", 500},
                                                    Dialogue{"ATI", 5}, Dialogue{"ATI", 5}));
}

TEST_F(BringUp, AdapterTimeoutGoesOutInStepsOfFourMilliseconds)
{
    struct Row
    {
        unsigned int ms;
        char const* command;
    };
    for (Row const row :
         {Row{400, "ATST64"}, Row{0, "ATST0"}, Row{3, "ATST0"}, Row{4, "ATST1"}, Row{60, "ATSTf"}, Row{63, "ATSTf"},
          Row{64, "ATST10"}, Row{1020, "ATSTff"}, Row{1021, "ATSTff"}, Row{4'000'000'000, "ATSTff"}}) {
        m_channel->expect(row.command).reply("OK\r>");
        EXPECT_TRUE(m_device.setTimeout(row.ms)) << row.ms;
    }
}

TEST_F(BringUp, OtherSettingsHaveTheirOwnFailureTexts)
{
    m_channel->expect("ATH1").reply("a\r>");
    m_channel->expect("ATH0").reply("b\r>");
    m_channel->expect("ATD1").reply("c\r>");
    EXPECT_FALSE(m_device.turnHeadersOn());
    EXPECT_FALSE(m_device.turnHeadersOff());
    EXPECT_FALSE(m_device.displayDlc());
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Failed to set headers on. Response: A",
                                           "FATAL Failed to set headers off. Response: B",
                                           "FATAL Failed to set display DLC. Response: C"));
    m_channel->expect("ATD1").reply("OK\r>");
    EXPECT_TRUE(m_device.displayDlc());
}

TEST_F(BringUp, LinkLostHalfWayDisablesTheDevice)
{
    m_channel->expect("ATI").reply("ELM327 v1.5\r\r>");
    m_channel->expect("AT@1").after(100).reply("OBDII").loseLink();
    EXPECT_FALSE(m_device.initialize());
    EXPECT_THAT(m_channel->sentBytes(), ElementsAre("ATI\r", "AT@1\r"));
    EXPECT_EQ(m_device.device(), "");
    EXPECT_FALSE(m_device.isEnabled());
    for (std::string const& line : m_log.lines()) {
        EXPECT_EQ(line, "ERROR Invalid connection -> skip");
    }
}

TEST_F(BringUp, TextsMayBeReadFromOtherThreadsMeanwhile)
{
    std::atomic<bool> running{true};
    std::atomic<int> reads{0};
    std::thread reader([&] {
        while (running) {
            std::string const name = m_device.device();
            EXPECT_TRUE(name.empty() || name == "ELM327 v1.5") << name;
            m_device.description();
            m_device.identification();
            m_device.getProtocolDescription();
            m_device.getProtocol();
            m_device.isEnabled();
            ++reads;
        }
    });
    for (int round = 0; round < 20 || (reads == 0 && round < 20'000); ++round) {
        support::expectInitialize(*m_channel);
        support::expectDetectVehicle(*m_channel);
        support::expectClose(*m_channel);
        EXPECT_TRUE(m_device.initialize());
        EXPECT_TRUE(m_device.detectVehicle(VehicleProtocol::Automatic));
        m_device.close();
    }
    running = false;
    reader.join();
    EXPECT_GT(reads, 0);
}

} // namespace
