// The shapes of commands at their ends, and the states of an adapter between them.
#include "simulator/adapter/profile.h"
#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

namespace {

using obdsim::AdapterFamily;
using obdsim::Ms;
using obdsim::Quirk;
using obdsim::Time;

TEST(CommandLimits, whatIsBesideAShapeIsRefused)
{
    auto host = unplugged("elm327-v2.3");
    host.ask("ATE0");
    for (char const* const command : {"ATAT3",    "ATATX",        "ATAT/",
                                      "ATE/",     "ATEX",         "ATBRD00",
                                      "ATFCSD",   "ATFCSD300",    "ATFCSD300000000000",
                                      "ATFCSM0X", "ATFCSM1",      "ATFCSM2",
                                      "ATFCSM3",  "ATSP",         "ATSPB6",
                                      "ATSPD",    "ATSPA00",      "ATSH1234",
                                      "ATSW",     "ATIFR3",       "ATIB11",
                                      "ATCTM2",   "ATMP12345678", "ATCRA7YX",
                                      "ATPPOON",  "AT@3",         "AT@3XY",
                                      "010CG",    "01G",          "0101010101010101",
                                      "STI",      "VTI"}) {
        EXPECT_EQ(host.ask(command), "?\r\r>") << command;
    }
    for (char const* const command : {"ATAT0", "ATAT1", "ATAT2", "ATFCSD30", "ATFCSD3000000000", "ATFCSM2", "ATFCSM0",
                                      "ATSP00", "ATSPC", "ATSPAC", "ATBRT00", "ATIFR0", "ATIFR2", "ATIFRH"}) {
        EXPECT_EQ(host.ask(command), "OK\r\r>") << command;
    }
    EXPECT_EQ(unplugged("stn2120").ask({"ATE0", "VTI"}), "?\r\r>") << "of programs on other chips";
}

TEST(CommandLimits, requestsHaveSevenBytesOrEight)
{
    constexpr char const* car =
        "name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\nraw = { \"01020304050607\" = \"41 01\", "
        "\"0102030405060708\" = \"41 02\" }\n";
    EXPECT_EQ(withVehicle(car).ask({"ATE0", "ATS0", "ATSP6", "01020304050607"}), "4101\r\r>");
    EXPECT_EQ(withVehicle(car).ask({"ATE0", "ATS0", "ATSP6", "0102030405060708"}), "?\r\r>");
    EXPECT_EQ(withVehicle(car).ask({"ATE0", "ATS0", "ATSP6", "ATAL", "0102030405060708"}), "4102\r\r>");
    EXPECT_EQ(withVehicle(car).ask({"ATE0", "ATS0", "ATSP6", "ATAL", "010203040506070809"}), "?\r\r>");
    EXPECT_EQ(withVehicle(car).ask({"ATE0", "ATS0", "ATSP6", "ATCAF0", "0701020304050607"}), "0241010000000000\r\r>")
        << "with its PCI byte";
    EXPECT_EQ(withVehicle(car).ask({"ATE0", "ATS0", "ATSP6", "ATCAF0", "070102030405060708"}), "?\r\r>");
}

TEST(CommandLimits, responsesAreCountedByOtherFamiliesAndFromV13On)
{
    auto const asked = [](AdapterFamily family, int level) {
        obdsim::AdapterProfile profile = *obdsim::findProfile("elm327-v2.3");
        profile.family = family;
        profile.level = level;
        Conversation host(std::make_shared<obdsim::Adapter>(
            profile, std::make_shared<obdsim::Vehicle>(obdsim::loadVehicle("petrol-can11"))));
        return host.ask({"ATE0", "ATSP6", "011C1"});
    };
    EXPECT_EQ(asked(AdapterFamily::Elm, 129), "?\r\r>");
    EXPECT_EQ(asked(AdapterFamily::Elm, 130), "41 1C 06 \r\r>");
    EXPECT_EQ(asked(AdapterFamily::ObdPros, 120), "41 1C 06 \r\r>");
}

TEST(CommandLimits, commandsOfFamiliesAreAsOldAsTheyAre)
{
    for (auto const& [key, commands] :
         {std::pair{"diamex", std::vector{"!00", "!01", "!10", "N", "P6", "PA6", "D", "Z", "SH7E0"}},
          {"obdkey", {"@1", "@2", "DP", "DPN", "SP6", "SPA6", "RV", "I"}},
          {"obdpros", {"SCS6", "@1", "@2"}}}) {
        obdsim::AdapterProfile profile = *obdsim::findProfile(key);
        profile.level = 100;
        for (char const* const command : commands) {
            EXPECT_TRUE(obdsim::findCommand(profile, command)) << key << " " << command;
        }
    }
    obdsim::AdapterProfile elm = *obdsim::findProfile("elm327-v2.3");
    elm.level = 100;
    for (char const* const command :
         {"@1",   "AL", "BD", "BI", "CAF0", "CFC0", "CP18", "CS", "CV1234", "D",  "DP",  "DPN", "E0", "H0", "I",
          "IB10", "L0", "M0", "MA", "MR10", "MT10", "NL",   "PC", "R0",     "RV", "SP6", "TP6", "WS", "Z",  "SH7E0"}) {
        EXPECT_TRUE(obdsim::findCommand(elm, command)) << command;
    }
    elm.level = 99;
    EXPECT_FALSE(obdsim::findCommand(elm, "Z"));
}

TEST(CommandLimits, aBannerInSmallLettersIsOfItsFamily)
{
    for (auto const& [banner, family] : {std::pair{"diamex dxm v9", AdapterFamily::Diamex},
                                         {"plxkiwi 3", AdapterFamily::Kiwi},
                                         {"Elm327 v9.9", AdapterFamily::Elm},
                                         {"obdkey 2", AdapterFamily::ObdKey},
                                         {"My OBDPro", AdapterFamily::ObdPros},
                                         {"Adapter", AdapterFamily::Other}}) {
        auto const profile = obdsim::profileForBanner(banner);
        EXPECT_EQ(profile.family, family) << banner;
        EXPECT_EQ(profile.banner, banner);
    }
    EXPECT_EQ(obdsim::profileForBanner("ELM327 v2.3").key, "elm327-v2.3");
    EXPECT_EQ(obdsim::profileForBanner("").key, "elm327-v1.5");
    EXPECT_EQ(obdsim::profileForBanner("").banner, "ELM327 v1.5");
}

TEST(CommandLimits, theBufferHoldsTheHeaderThatWasSet)
{
    EXPECT_EQ(unplugged().ask({"ATE0", "ATBD"}), "00 00 00 00 00 00 00 00 00 00 00 00 00 \r\r>");
    EXPECT_EQ(unplugged().ask({"ATE0", "ATSH7E0", "ATBD"}), "02 07 E0 00 00 00 00 00 00 00 00 00 00 \r\r>");
    auto host = unplugged();
    host.ask({"ATE0", "ATPPS"});
    EXPECT_EQ(host.lastWait(), Ms(4));
}

TEST(CommandLimits, voltsHaveOneDecimal)
{
    for (auto const& [volts, told] :
         {std::pair{"11.84", "11.8V"}, {"11.85", "11.9V"}, {"9.96", "10.0V"}, {"0.04", "0.0V"}}) {
        auto host =
            withVehicle("name = \"Car\"\nprotocol = 6\nvolts = " + std::string(volts) + "\n[[module]]\nid = \"7E8\"\n");
        EXPECT_EQ(host.ask({"ATE0", "ATRV"}), std::string(told) + "\r\r>");
    }
}

/// Characters that come before the reply to the command is out.
std::string interrupted(Conversation& host, std::string const& command, Time after, std::string const& typed)
{
    host.peer().receive(command + "\r");
    std::string said = host.peer().advanceTo(host.peer().now() + after);
    host.peer().receive(typed);
    return said + host.listen();
}

TEST(AdapterStates, whatIsTypedDuringAResetIsLost)
{
    auto host = unplugged();
    host.ask("ATE0");
    EXPECT_EQ(interrupted(host, "ATZ", Ms(803), "ATI\r"), "\r\rELM327 v1.5\r\r>");
    host.ask("ATE0");
    EXPECT_EQ(interrupted(host, "ATZ", Ms(804), "ATE0\r"), "\r\rELM327 v1.5\r\r>ATE0\rOK\r\r>");
}

TEST(AdapterStates, aPromptMayBeAnsweredAtOnce)
{
    auto host = simulated("petrol-can11");
    host.ask({"ATE0", "ATSP6", "ATS0", "ATSH7E0"});
    std::string const first = host.ask("011C1");
    Time const whole = host.lastWait();
    EXPECT_EQ(interrupted(host, "011C1", whole, "ATI\r"), first + "ELM327 v1.5\r\r>");
    EXPECT_EQ(interrupted(host, "011C1", whole - Time(1), "ATI\r"), "STOPPED\r\r>");
    EXPECT_EQ(host.lastWait(), Ms(4));
    host.peer().receive("0100\r");
    host.pass(Ms(20));
    host.peer().receive("X");
    host.pass(Ms(4));
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>") << "it has stopped by then";
}

TEST(AdapterStates, aReturnAloneConfirmsARate)
{
    auto host = unplugged();
    host.ask({"ATE0", "ATBRTFF"});
    host.peer().receive("ATBRD23\r");
    EXPECT_EQ(host.peer().advanceTo(host.peer().now() + Ms(14)), "OK\rELM327 v1.5\r");
    host.peer().receive("ATI");
    EXPECT_EQ(host.peer().advanceTo(host.peer().now() + Ms(10)), "") << "what is no return means nothing";
    host.peer().receive("\r");
    EXPECT_EQ(host.listen(), "OK\r\r>");
}

TEST(AdapterStates, aNewClientEndsThemAll)
{
    for (char const* const command : {"ATMA", "ATLP", "ATBRD23"}) {
        auto host = simulated("petrol-can11");
        host.ask({"ATE0", "ATSP6"});
        host.peer().receive(std::string(command) + "\r");
        host.pass(Ms(5));
        host.peer().connect();
        EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>") << command;
    }
    auto late = unplugged("elm327-v1.5", {Quirk::PromptLate});
    late.ask("ATE0");
    late.peer().connect();
    EXPECT_EQ(late.ask("ATI"), "ELM327 v1.5\r\r>") << "a prompt that is owed is owed no more";
}

TEST(AdapterStates, eachCharacterThatMeansNothingIsLeftOut)
{
    auto host = unplugged();
    host.ask("ATE0");
    host.peer().receive(std::string("\n\0A\0TI\n\r", 8));
    EXPECT_EQ(host.listen(), "ELM327 v1.5\r\r>");
    EXPECT_EQ(host.lastWait(), Ms(4));
}

TEST(Frames, numbersOfLinesGoOnBehindF)
{
    std::string payload;
    for (int i = 0; i < 300; ++i) {
        payload += "55";
    }
    auto host =
        withVehicle("name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\nframe_gap = 0\nraw = { \"0902\" = \"" +
                        payload + "\" }\n",
                    "elm327-v2.3");
    std::string const reply = host.ask({"ATE0", "ATS0", "ATSP6", "0902"});
    EXPECT_EQ(reply.substr(0, 19), "12C\r0:555555555555\r");
    for (auto const& [line, number] : {std::pair{1U, '1'}, {15U, 'F'}, {16U, '0'}, {42U, 'A'}}) {
        EXPECT_EQ(reply[19 + (line - 1) * 17], number) << line;
    }
    auto counting =
        withVehicle("name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\nframe_gap = 0\nraw = { \"0902\" = \"" +
                        payload + "\" }\n",
                    "elm327-v2.3", {Quirk::CountMessages});
    EXPECT_EQ(counting.ask({"ATE0", "ATS0", "ATSP6", "09021"}), reply) << "one message, and no wait behind it";
    EXPECT_LT(counting.lastWait(), host.lastWait());
}

} // namespace
