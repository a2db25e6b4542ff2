// What a replay takes off, puts in, and tells apart.
#include "simulator/replayscript.h"
#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Ms;
using obdsim::ReplayScript;

Conversation playing(std::string const& turns,
                     std::string const& header = "adapter: ELM327 v2.3\nprotocol: 6\nheaders: off\n")
{
    auto script =
        std::make_shared<ReplayScript>(obdsim::parseDialogue("vehicle: car\n" + header + "\n" + turns, "test"));
    return Conversation(std::make_shared<obdsim::Adapter>(obdsim::profileForBanner(script->banner()), nullptr, script));
}

Conversation quietly(std::string const& turns,
                     std::string const& header = "adapter: ELM327 v2.3\nprotocol: 6\nheaders: off\n")
{
    auto host = playing(turns, header);
    host.ask("ATE0");
    return host;
}

std::string const raw = "adapter: ELM327 v2.3\nprotocol: 6\nheaders: off\nraw: yes\n";

TEST(ReplayHabits, whatIsMissingOfTheEndIsPutIn)
{
    for (auto const& [recorded, played] : {std::pair{"41", "41\r\r>"},
                                           {"41\\r", "41\r\r>"},
                                           {"41\\r\\r", "41\r\r>"},
                                           {"41\\r\\r\\r", "41\r\r\r>"},
                                           {"41>", "41>"},
                                           {"\\r", "\r\r>"},
                                           {"\\r\\r", "\r\r>"},
                                           {"\\r\\r>", "\r\r>"}}) {
        EXPECT_EQ(quietly("-> 0100\n<- " + std::string(recorded) + "\n").ask("0100"), played) << recorded;
        EXPECT_EQ(quietly("-> 0100\n<- " + std::string(recorded) + "\n", raw).ask("0100").find('>') !=
                      std::string::npos,
                  std::string(recorded).find('>') != std::string::npos)
            << recorded;
    }
    EXPECT_EQ(quietly("-> 0100\n").ask("0100"), "\r\r>") << "nothing came";
}

TEST(ReplayHabits, anEchoIsTakenOffWhereItBegins)
{
    std::string const turns = "-> 07\n<- 07\\r\n.. 5\n<- 07\\r47\\r\\r>\n->\n<- \\rBB\\r\\r>\n-> 0A\n<- 0a 0 \\r\\r>\n";
    auto host = quietly(turns);
    EXPECT_EQ(host.ask("07"), "07\r47\r\r>") << "what looks like one further on is none";
    EXPECT_EQ(host.ask("07"), "\rBB\r\r>") << "nor is an empty line";
    EXPECT_EQ(host.ask("0A"), "0a 0 \r\r>");
    EXPECT_EQ(quietly("-> 0A\n<- 0 a\\r4A\\r\\r>\n").ask("0A"), "4A\r\r>") << "in any case, with blanks";
    EXPECT_EQ(quietly(turns, raw).ask("07"), "07\r07\r47\r\r>") << "raw ones have it, as nobody else echoes";
    EXPECT_EQ(playing(turns, raw).ask("07"), "07\r07\r47\r\r>") << "the adapter's own, and the one further on";
}

TEST(ReplayHabits, noticesAreSaidOnce)
{
    std::string const turns =
        "-> 0100\n<- SEARCHING...\\r\n.. 800\n<- 4100\\r\\r>\n-> 0101\n<- BUS INIT: OK\\r4101\\r\\r>\n"
        "-> 0102\n<- BUS INIT: ...OK\\n\\rSEARCHING...\\r4102\\r\\r>\n";
    auto host = quietly(turns);
    for (auto const& [request, first, again] : {std::tuple{"0100", "SEARCHING...\r4100\r\r>", "4100\r\r>"},
                                                {"0101", "BUS INIT: OK\r4101\r\r>", "4101\r\r>"},
                                                {"0102", "BUS INIT: ...OK\n\rSEARCHING...\r4102\r\r>", "4102\r\r>"}}) {
        EXPECT_EQ(host.ask(request), first);
        EXPECT_EQ(host.ask(request), again);
        EXPECT_EQ(host.ask(request), again);
    }
    auto faithful = quietly("-> 0100\n<- SEARCHING...\\r4100\\r\\r>\n", raw);
    EXPECT_EQ(faithful.ask({"0100", "0100"}), "SEARCHING...\r4100\r\r>") << "raw ones say it again";
}

TEST(ReplayHabits, theBannerIsALineOfFiveLettersAtLeast)
{
    auto const banner = [](std::string const& turns, std::string const& adapter = "a clone") {
        return ReplayScript(obdsim::parseDialogue("vehicle: car\nadapter: " + adapter + "\n\n" + turns, "test"))
            .banner();
    };
    EXPECT_EQ(banner("-> ATI\n<- OBDII\\r\\r>\n"), "OBDII");
    EXPECT_EQ(banner("-> ATI\n<- OBD2\\r\\r>\n"), "");
    EXPECT_EQ(banner("-> ATI\n<- OBD>II\\r~BDII \\r\\r>\n"), "~BDII ");
    EXPECT_EQ(banner("-> ATI\n<- OBDII\n"), "OBDII") << "without a return";
    EXPECT_EQ(banner("-> ATI\n<- \\xC3BDI\\x7FI 22\\r>\n"), "");
    EXPECT_EQ(banner("-> ATI\n<- ?\\r\\r>\n-> ATWS\n<- ATWS\\r\\r\\rELM327 v9\\r\\r>\n"), "ELM327 v9");
    EXPECT_EQ(banner("-> AT@1\n<- OBDII to RS232\\r\\r>\n-> ATZ\n<- ATZ\\r\\rSCAN 1\\r>\n-> ATI\n<- OTHER\\r>\n"),
              "SCAN 1");
    EXPECT_EQ(banner("", "clone, ELM327 v2.1"), "ELM327 v2.1");
    EXPECT_EQ(banner("", "ELM327 v1.4 and more"), "ELM327 v1.4");
    EXPECT_EQ(banner("", "ELM327"), "");
}

TEST(ReplayHabits, questionsForTheProtocolAreAnsweredAsBehindTheSearch)
{
    std::string const turns =
        "-> ATI\n<- ELM327 v2.3\\r\\r>\n-> ATDPN\n<- A0\\r\\r>\n-> 0100\n<- NO DATA\\r\\r>\n-> ATDPN\n<- A1\\r\\r>\n"
        "-> 0100\n<- 4100BE3EA813\\r\\r>\n-> ATDPN\n<- A6\\r\\r>\n-> ATRV\n<- 12.1V\\r\\r>\n";
    auto host = quietly(turns);
    EXPECT_EQ(host.ask("ATDPN"), "A0\r\r>");
    EXPECT_EQ(host.ask({"0100", "ATDPN"}), "A1\r\r>") << "no car has answered";
    EXPECT_EQ(host.ask({"0100", "ATDPN"}), "A6\r\r>");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v2.3\r\r>") << "other commands are answered as before";
    auto asking = quietly(turns);
    EXPECT_EQ(asking.ask({"0100", "0100", "ATDPN"}), "A6\r\r>") << "none of those before";
    auto other = quietly("-> ATN\n<- A0\\r\\r>\n-> 0100\n<- 4100BE3EA813\\r\\r>\n-> ATN\n<- A6\\r\\r>\n",
                         "adapter: x\nprotocol: 6\nheaders: off\n");
    EXPECT_EQ(other.ask({"0100", "ATN"}), "A6\r\r>");
    auto errors = quietly("-> ATDPN\n<- A0\\r\\r>\n-> 0100\n<- UNABLE TO CONNECT 1\\r\\r>\n-> 0101\n<- BUS BUSY "
                          "2\\r\\r>\n-> 0102\n<- ?3\\r\\r>\n"
                          "-> 0103\n<- CAN ERROR 4\\r\\r>\n-> 0104\n<- STOPPED 5\\r\\r>\n-> 0105\n<- BUFFER FULL "
                          "6\\r\\r>\n-> 0106\n<- OK\\r\\r>\n-> ATDPN\n<- A0 still\\r\\r>\n");
    for (char const* const request : {"0100", "0101", "0102", "0103", "0104", "0105", "0106"}) {
        errors.ask(request);
    }
    EXPECT_EQ(errors.ask("ATDPN"), "A0\r\r>");
    EXPECT_EQ(errors.ask("ATDPN"), "A0 still\r\r>") << "none of these was a car's";
}

TEST(ReplayHabits, anyProtocolWillDoWhereNoneIsRecorded)
{
    std::string const unknown = "adapter: ELM327 v2.3\nprotocol: 0\nheaders: off\n";
    std::string const turns = "-> ATDPN\n<- A0\\r\\r>\n-> 0100\n<- 4100BE3EA813\\r\\r>\n";
    EXPECT_EQ(quietly(turns, unknown).ask({"ATSP3", "0100"}), "4100BE3EA813\r\r>");
    EXPECT_EQ(quietly(turns, unknown).ask({"ATSP6", "0100"}), "4100BE3EA813\r\r>");
    EXPECT_EQ(quietly(turns + "-> ATDPN\n<- A9\\r\\r>\n", unknown).ask({"ATSP6", "0100"}), "CAN ERROR\r\r>");
    EXPECT_EQ(quietly(turns).ask({"ATSP7", "0100"}), "CAN ERROR\r\r>");
}

TEST(ReplayHabits, whatWasNotAskedTakesTheTimeOfNoAnswer)
{
    auto host = quietly("-> 0100\n<- 4100BE3EA813\\r\\r>\n");
    host.ask({"ATST10", "0120"});
    EXPECT_EQ(host.lastWait(), Ms(4) + 16 * std::chrono::microseconds(4096));
}

TEST(ReplayHabits, lateHeadersMayGoAgain)
{
    std::string const turns = "-> 0100\n<- 4100AA\\r\\r>\n-> ATH1\n<- OK\\r\\r>\n-> 0100\n<- 7E8064100AA\\r\\r>\n-> "
                              "ATH0\n<- OK\\r\\r>\n-> 0100\n<- 4100BB\\r\\r>\n"
                              "-> ATRV\n<- 12.0V\\r\\r>\n";
    std::string const late = "adapter: ELM327 v2.3\nprotocol: 6\nheaders: late\n";
    auto host = quietly(turns, late);
    host.ask("ATH1");
    EXPECT_EQ(host.ask("0100"), "7E8064100AA\r\r>");
    EXPECT_EQ(host.ask("0100"), "7E8064100AA\r\r>") << "there is one only";
    EXPECT_EQ(host.ask("ATRV"), "12.0V\r\r>") << "commands have no headers";
    host.ask("ATH0");
    for (char const* const reply : {"4100AA", "7E8064100AA", "4100BB", "4100BB"}) {
        EXPECT_EQ(host.ask("0100"), std::string(reply) + "\r\r>") << "each in its turn, counted by itself";
    }
    auto plain = quietly(turns, "adapter: ELM327 v2.3\nprotocol: 6\nheaders: on\n");
    EXPECT_EQ(plain.ask({"ATH1", "0100"}), "4100AA\r\r>") << "nothing is hidden where all is told";
}

TEST(ReplayHabits, aDigitBehindARequestIsLeftOut)
{
    auto host = quietly("-> 0101\n<- 41\\r\\r>\n-> 012\n<- 42\\r\\r>\n-> ATRV1\n<- x\\r\\r>\n-> ATRV\n<- "
                        "12.0V\\r\\r>\n-> 1\n<- ?\\r\\r>\n");
    EXPECT_EQ(host.ask("01013"), "41\r\r>");
    EXPECT_EQ(host.ask("01"), "42\r\r>");
    EXPECT_EQ(host.ask("ATRV"), "12.0V\r\r>") << "of a command it is a part";
    EXPECT_EQ(host.ask("ATRV1"), "x\r\r>");
    EXPECT_EQ(host.ask("1"), "?\r\r>");
}

} // namespace
