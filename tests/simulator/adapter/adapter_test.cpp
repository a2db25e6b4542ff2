#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Ms;
using obdsim::Time;

TEST(Adapter, resetGivesEmptyLinesAndTheBanner)
{
    auto host = simulated("petrol-can11");
    EXPECT_EQ(host.ask("ATZ"), "ATZ\r\r\rELM327 v1.5\r\r>");
    EXPECT_GE(host.lastWait(), Ms(500));
    EXPECT_EQ(host.ask({"ATE0", "ATZ"}), "\r\rELM327 v1.5\r\r>");
}

TEST(Adapter, echoesUntilToldNotTo)
{
    auto host = simulated("petrol-can11");
    EXPECT_EQ(host.ask("ATI"), "ATI\rELM327 v1.5\r\r>");
    EXPECT_EQ(host.ask("ATE0"), "ATE0\rOK\r\r>");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
    EXPECT_EQ(host.ask("ATE1"), "OK\r\r>");
    EXPECT_EQ(host.ask("  at i "), "  at i \rELM327 v1.5\r\r>");
}

TEST(Adapter, echoesCharacterByCharacter)
{
    auto host = simulated("petrol-can11");
    host.peer().receive("A");
    EXPECT_EQ(host.listen(), "A");
    host.peer().receive("TI\r");
    EXPECT_EQ(host.listen(), "TI\rELM327 v1.5\r\r>");
}

TEST(Adapter, defaultsTurnTheEchoOnAgain)
{
    auto host = simulated("petrol-can11");
    EXPECT_EQ(host.ask({"ATE0", "ATD"}), "OK\r\r>");
    EXPECT_EQ(host.ask("ATRV").substr(0, 5), "ATRV\r");
}

TEST(Adapter, linefeedsFollowEveryReturn)
{
    auto host = simulated("petrol-can11");
    EXPECT_EQ(host.ask({"ATL1", "ATI"}), "ATI\r\nELM327 v1.5\r\n\r\n>");
    EXPECT_EQ(host.ask({"ATL0", "ATI"}), "ATI\rELM327 v1.5\r\r>");
}

TEST(Adapter, refusesWhatItDoesNotKnow)
{
    auto host = unplugged();
    host.ask("ATE0");
    for (char const* command : {"ATXYZ", "ATAL1", "ATE2", "ATSPF", "BRD08", "ATBRD099", "ATAMC", "ATCERF1", "1",
                                "HELLO", "AT", "ATCF0", "ATSH12", "STI", "VTI", "AT@2"}) {
        EXPECT_EQ(host.ask(command), "?\r\r>") << command;
    }
}

TEST(Adapter, knowsTheCommandsOfItsVersion)
{
    auto host = unplugged();
    host.ask("ATE0");
    for (char const* command :
         {"ATAL",    "ATNL",           "ATAR",      "ATAT0",   "ATAT1",    "ATAT2",         "ATBI",       "ATBRT0F",
          "ATCAF0",  "ATCAF1",         "ATCEA",     "ATCEA04", "ATCF111",  "ATCF00000111",  "ATCFC0",     "ATCFC1",
          "ATCM7FF", "ATCM1FFFFFFF",   "ATCP18",    "ATCRA",   "ATCRA7C0", "ATCRA000007C0", "ATCV1234",   "ATD0",
          "ATD1",    "ATFCSD300000",   "ATFCSH712", "ATFCSM1", "ATH0",     "ATH1",          "ATIB10",     "ATIIA51",
          "ATJE",    "ATKW0",          "ATL0",      "ATM0",    "ATM1",     "ATPC",          "ATPP2ASV38", "ATR0",
          "ATR1",    "ATRA70",         "ATS0",      "ATS1",    "ATSH7E0",  "ATSH8213F0",    "ATSP0",      "ATSP00",
          "ATSP6",   "ATSPA6",         "atsp a",    "ATSR70",  "ATST64",   "ATSTff",        "ATSW92",     "ATTP6",
          "ATTPA6",  "ATWM8012F1013E", "ATPB0104"}) {
        EXPECT_EQ(host.ask(command), "OK\r\r>") << command;
    }
}

TEST(Adapter, olderVersionsKnowLess)
{
    auto old = unplugged("elm327-v1.2");
    old.ask("ATE0");
    EXPECT_EQ(old.ask("ATS0"), "?\r\r>");
    EXPECT_EQ(old.ask("ATI"), "ELM327 v1.2\r\r>");
    auto newer = unplugged("elm327-v1.3a");
    newer.ask("ATE0");
    EXPECT_EQ(newer.ask("ATS0"), "OK\r\r>");
    EXPECT_EQ(newer.ask("ATIGN"), "?\r\r>");
    auto newest = unplugged("elm327-v2.3");
    newest.ask("ATE0");
    EXPECT_EQ(newest.ask("ATAMC"), "00\r\r>");
    EXPECT_EQ(newest.ask("ATSH18DB33F1"), "OK\r\r>");
}

TEST(Adapter, tellsItsSettingsInTheFormsOfTheChip)
{
    auto host = unplugged();
    host.ask("ATE0");
    EXPECT_EQ(host.ask("AT@1"), "OBDII to RS232 Interpreter\r\r>");
    EXPECT_EQ(host.ask("ATRV"), "12.2V\r\r>");
    EXPECT_EQ(host.ask("ATDP"), "AUTO\r\r>");
    EXPECT_EQ(host.ask("ATDPN"), "A0\r\r>");
    EXPECT_EQ(host.ask({"ATTP6", "ATDPN"}), "6\r\r>");
    EXPECT_EQ(host.ask("ATDP"), "ISO 15765-4 (CAN 11/500)\r\r>");
    EXPECT_EQ(host.ask({"ATSPA5", "ATDPN"}), "A5\r\r>");
    EXPECT_EQ(host.ask("ATDP"), "AUTO, ISO 14230-4 (KWP FAST)\r\r>");
    EXPECT_EQ(host.ask("ATCS"), "T:00 R:00 \r\r>");
    EXPECT_EQ(host.ask("ATKW"), "1:-- 2:--\r\r>");
    EXPECT_EQ(host.ask("ATIGN"), "ON\r\r>");
    std::string const parameters = host.ask("ATPPS");
    EXPECT_EQ(parameters.substr(0, 36), "00:FF F  01:FF F  02:FF F  03:32 F\r0");
    EXPECT_EQ(std::count(parameters.begin(), parameters.end(), '\r'), 13);
    EXPECT_EQ(host.ask({"ATSH8213F0", "ATBD"}), "03 82 13 F0 00 00 00 00 00 00 00 00 00 \r\r>");
}

TEST(Adapter, emptyLineRepeatsTheLastCommand)
{
    auto host = simulated("petrol-can11");
    EXPECT_EQ(host.ask(""), "\r?\r\r>") << "nothing to repeat";
    EXPECT_EQ(host.ask({"ATE0", "ATI", ""}), "ELM327 v1.5\r\r>");
    host.ask("ATZ");
    EXPECT_EQ(host.ask(""), "\r?\r\r>") << "a reset forgets the command";
}

TEST(Adapter, nulAndLineFeedAreNoCharacters)
{
    auto host = unplugged();
    host.peer().receive(std::string("A\0T\nI\r", 6));
    EXPECT_EQ(host.listen(), "ATI\rELM327 v1.5\r\r>");
}

TEST(Adapter, endlessLineIsRefused)
{
    auto host = unplugged();
    host.ask("ATE0");
    EXPECT_EQ(host.ask(std::string(300, 'A')), "?\r\r>");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
}

TEST(Adapter, characterStopsARequest)
{
    auto host = simulated("petrol-can11");
    host.ask("ATE0");
    host.peer().receive("0100\r");
    host.pass(Ms(20));
    EXPECT_EQ(host.ask("ATI"), "STOPPED\r\r>") << "what comes with the character is lost";
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
}

TEST(Adapter, monitorsUntilACharacterComes)
{
    auto host = simulated("petrol-can11");
    host.ask({"ATE0", "ATSP6"});
    EXPECT_EQ(host.ask("ATMA"), "");
    host.peer().receive("X");
    EXPECT_EQ(host.listen(), "STOPPED\r\r>");
}

TEST(Adapter, sleepsAndWakesWithItsBanner)
{
    auto host = simulated("petrol-can11");
    EXPECT_EQ(host.ask({"ATE0", "ATLP"}), "OK\r\r>");
    host.peer().receive("A");
    EXPECT_EQ(host.listen(), "\r\rELM327 v1.5\r\r>");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
}

TEST(Adapter, rateChangeWaitsForAReturn)
{
    auto host = simulated("petrol-can11");
    host.ask({"ATE0", "ATBRTFF"});
    host.peer().receive("ATBRD23\r");
    host.pass(Ms(4));
    EXPECT_EQ(host.peer().advanceTo(host.peer().now() + Ms(20)), "ELM327 v1.5\r");
    EXPECT_EQ(host.ask(""), "OK\r\r>");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
}

TEST(Adapter, rateChangeWithoutReturnEndsWithThePrompt)
{
    auto host = simulated("petrol-can11");
    host.ask("ATE0");
    EXPECT_EQ(host.ask("ATBRD23"), "OK\rELM327 v1.5\r\r>");
    EXPECT_EQ(host.lastWait(), Ms(4 + 10 + 75));
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
}

TEST(Adapter, newClientFindsTheSettingsAndNoOldBytes)
{
    auto host = simulated("petrol-can11");
    host.ask("ATE0");
    host.peer().receive("0100\rAT");
    host.peer().connect();
    EXPECT_EQ(host.listen(), "");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
}

struct FamilyCase
{
    char const* adapter;
    char const* command;
    char const* reply;
};

FamilyCase const familyCases[] = {
    {"obdkey", "ATI", "OBDKey 1.30"},
    {"obdkey", "ATTP0", "?"},
    {"obdkey", "ATSP0", "OK"},
    {"obdkey", "ATBRD23", "?"},
    {"obdkey", "AT@2", "KB-0130"},
    {"diamex", "ATI", "DIAMEX DXM v1.2"},
    {"diamex", "AT!01", "DIAMEX DXM Module"},
    {"diamex", "AT!00", "DX-20071"},
    {"diamex", "AT!10", "12.2V"},
    {"diamex", "ATN", "A0"},
    {"diamex", "ATP6", "6=ISO 15765-4 (CAN 11/500)"},
    {"diamex", "ATP0", "0=AUTO"},
    {"diamex", "ATPA3", "3=ISO 9141-2"},
    {"diamex", "ATRV", "?"},
    {"diamex", "ATDPN", "?"},
    {"diamex", "ATSP6", "?"},
    {"kiwi", "ATI", "PLXKiwi v1.4"},
    {"kiwi", "ATTP6", "?"},
    {"kiwi", "ATBRT0F", "OK"},
    {"obdpros", "ATI", "OBDPros v3.1"},
    {"obdpros", "ATSCS6", "OK"},
    {"obdpros", "ATBRD23", "?"},
    {"unknown", "ATI", "CarWave Adapter 7"},
    {"unknown", "ATTP0", "?"},
    {"stn2120", "STI", "STN2120 v5.8.1"},
    {"stn2120", "STCSEGT1", "OK"},
    {"stn2120", "ATTP0", "OK"},
    {"elm327-v2.1", "AT!10", "?"},
};

TEST(Adapter, familiesDifferInTheirCommands)
{
    for (auto const& row : familyCases) {
        auto host = unplugged(row.adapter);
        host.ask("ATE0");
        EXPECT_EQ(host.ask(row.command), std::string(row.reply) + "\r\r>") << row.adapter << " " << row.command;
    }
}

TEST(Adapter, silentOneSaysNothing)
{
    auto host = simulated("petrol-can11", "silent");
    EXPECT_EQ(host.ask("ATZ"), "");
    EXPECT_EQ(host.ask("0100"), "");
}

TEST(Adapter, everyProfileAnswersItsName)
{
    for (auto const& key : obdsim::profileKeys()) {
        auto host = unplugged(key);
        std::string const reply = host.ask("ATI");
        std::string const banner = obdsim::findProfile(key)->banner;
        EXPECT_EQ(reply, key == "silent" ? "" : "ATI\r" + banner + "\r\r>") << key;
    }
}

} // namespace
