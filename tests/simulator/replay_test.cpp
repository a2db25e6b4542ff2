#include "simulator/replayscript.h"
#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Ms;
using obdsim::Time;

Conversation replaying(std::string const& header, std::string const& turns)
{
    auto script =
        std::make_shared<obdsim::ReplayScript>(obdsim::parseDialogue("vehicle: car\n" + header + "\n" + turns, "test"));
    auto profile = obdsim::profileForBanner(script->banner());
    return Conversation(std::make_shared<obdsim::Adapter>(std::move(profile), nullptr, script));
}

Conversation recorded(std::string const& name)
{
    return Conversation(obdsim::replay(VELMORA_SOURCE_DIR "/tests/dialogues/" + name + ".dialogue"));
}

std::string const kwp = "adapter: ELM327 v2.3 on an STN2120\nprotocol: 5\nheaders: on\n";

TEST(Replay, servesRepliesInTheirOrderAndThenTheLastAgain)
{
    auto host = replaying(kwp, "-> 010C\n<- 84F112410C0B30AA\\r\\r>\n-> 01 0c\n<- 84F112410C0D64AA\\r\\r>\n");
    host.ask("ATE0");
    EXPECT_EQ(host.ask("010C"), "84F112410C0B30AA\r\r>");
    EXPECT_EQ(host.ask("010c"), "84F112410C0D64AA\r\r>");
    EXPECT_EQ(host.ask("010C"), "84F112410C0D64AA\r\r>");
}

TEST(Replay, answersWhatWasNotRecordedAsTheAdapterWould)
{
    auto host = replaying(kwp, "-> 0100\n<- 86F1124100983B2013D0\\r\\r>\n");
    EXPECT_EQ(host.ask("ATI"), "ATI\rELM327 v2.3\r\r>");
    EXPECT_EQ(host.ask("ATE0"), "ATE0\rOK\r\r>");
    EXPECT_EQ(host.ask("ATXX"), "?\r\r>");
    EXPECT_EQ(host.ask("0120"), "NO DATA\r\r>");
    EXPECT_EQ(host.ask("HELLO"), "?\r\r>");
}

TEST(Replay, protocolIsThatOfTheRecordingOnceACarHasAnswered)
{
    auto host = replaying(kwp, "-> 0100\n<- 86F1124100983B2013D0\\r\\r>\n");
    host.ask({"ATE0", "ATSP0"});
    EXPECT_EQ(host.ask("ATDPN"), "A0\r\r>");
    host.ask("0100");
    EXPECT_EQ(host.ask("ATDPN"), "A5\r\r>");
    EXPECT_EQ(host.ask("ATDP"), "AUTO, ISO 14230-4 (KWP FAST)\r\r>");
    EXPECT_EQ(host.ask({"ATTP5", "0100"}), "86F1124100983B2013D0\r\r>");
    EXPECT_EQ(host.ask("ATDPN"), "5\r\r>");
}

TEST(Replay, otherProtocolsFailAsOnThatCar)
{
    auto host = replaying(kwp, "-> 0100\n<- 86F1124100983B2013D0\\r\\r>\n");
    EXPECT_EQ(host.ask({"ATE0", "ATSP6", "0100"}), "CAN ERROR\r\r>");
    EXPECT_EQ(host.ask({"ATSP3", "0100"}), "BUS INIT: ...ERROR\r\r>");
    EXPECT_EQ(host.ask({"ATSP0", "0100"}), "86F1124100983B2013D0\r\r>");
}

TEST(Replay, protocolNumberFromBeforeTheSearchIsNotToldBehindIt)
{
    auto host = replaying("adapter: ELM327 v2.2\nprotocol: 6\nheaders: off\n",
                          "-> ATDPN\n<- A0\\r\\r>\n-> 0100\n<- 4100BE3EA813\\r\\r>\n-> ATDPN\n<- A6\\r\\r>\n");
    host.ask({"ATE0", "0100"});
    EXPECT_EQ(host.ask("ATDPN"), "A6\r\r>");
}

TEST(Replay, echoIsTheHostsChoice)
{
    auto host = replaying(kwp, "-> ATI\n<- ATI\\rELM327 v2.3\\r\\r>\n-> 03\n<- 03\\r87F11843000000000000D3\\r\\r>\n");
    EXPECT_EQ(host.ask("ATI"), "ATI\rELM327 v2.3\r\r>");
    EXPECT_EQ(host.ask({"ATE0", "ATI"}), "ELM327 v2.3\r\r>");
    EXPECT_EQ(host.ask("03"), "87F11843000000000000D3\r\r>");
}

TEST(Replay, missingPromptIsPutInExceptInRawRecordings)
{
    std::string const turns = "-> 0100\n<- 4100BE3EA813\\r\n-> 0120\n<- 412080000000\n";
    auto host = replaying("adapter: x\nprotocol: 6\nheaders: off\n", turns);
    host.ask("ATE0");
    EXPECT_EQ(host.ask("0100"), "4100BE3EA813\r\r>");
    EXPECT_EQ(host.ask("0120"), "412080000000\r\r>");
    auto raw = replaying("adapter: x\nprotocol: 6\nheaders: off\nraw: yes\n", turns);
    raw.ask("ATE0");
    EXPECT_EQ(raw.ask("0100"), "4100BE3EA813\r");
}

TEST(Replay, pausesAreKept)
{
    auto host = replaying(kwp, "-> 0100\n<- SEARCHING...\\r\n.. 800\n<- 86F1124100983B2013D0\\r\\r>\n");
    host.ask("ATE0");
    host.peer().receive("0100\r");
    Time const start = host.peer().now();
    EXPECT_EQ(host.peer().advanceTo(start + Ms(799)), "SEARCHING...\r");
    EXPECT_EQ(host.peer().advanceTo(start + Ms(804)), "86F1124100983B2013D0\r\r>");
}

TEST(Replay, repeatedReplyHasNoSearchNotice)
{
    auto host = replaying(kwp, "-> 0100\n<- SEARCHING...\\r86F1124100983B2013D0\\r\\r>\n");
    host.ask("ATE0");
    EXPECT_EQ(host.ask("0100"), "SEARCHING...\r86F1124100983B2013D0\r\r>");
    EXPECT_EQ(host.ask("0100"), "86F1124100983B2013D0\r\r>");
}

TEST(Replay, noticeIsTakenOutOfTheMiddleToo)
{
    auto host = replaying(kwp, "-> 0100\n<- \\rBUS INIT: ...OK\\r\\n86F1124100983B2013D0\\r\\r>\n");
    host.ask("ATE0");
    EXPECT_EQ(host.ask("0100"), "\rBUS INIT: ...OK\r\n86F1124100983B2013D0\r\r>");
    EXPECT_EQ(host.ask("0100"), "\r86F1124100983B2013D0\r\r>");
}

TEST(Replay, protocolNotToldInTheHeaderIsThatOfTheRecordedAnswer)
{
    auto host = replaying("adapter: ELM327 v2.2\nprotocol: 0\nheaders: off\n",
                          "-> 0100\n<- 4100BE3EA813\\r\\r>\n-> ATDPN\n<- A6\\r\\r>\n-> ATDPN\n<- A7\\r\\r>\n");
    host.ask("ATE0");
    EXPECT_EQ(host.ask({"ATSP3", "0100"}), "BUS INIT: ...ERROR\r\r>");
    EXPECT_EQ(host.ask({"ATSP6", "0100"}), "4100BE3EA813\r\r>");
}

TEST(Replay, lateHeadersShowOnlyWhatWasRecordedWithThem)
{
    auto host = recorded("can11-a180d-three-modules");
    host.ask({"ATE0", "ATTP0"});
    EXPECT_EQ(host.ask("0100"), "SEARCHING...\r410098180001\r4100983BA017\r410098180011\r\r>");
    host.ask("ATH1");
    EXPECT_EQ(host.ask("0100"), "7EB06410098180001\r7E8064100983BA017\r7E906410098180011\r\r>");
    EXPECT_EQ(host.ask("0120"), "7EB06412080018001\r7E906412080018001\r7E8064120B819A015\r\r>");
}

TEST(Replay, emptyLineInTheRecordingRepeatsTheCommandBefore)
{
    auto host = replaying(kwp, "-> 07\n<- AA\\r\\r>\n->\n<- BB\\r\\r>\n");
    host.ask("ATE0");
    EXPECT_EQ(host.ask("07"), "AA\r\r>");
    EXPECT_EQ(host.ask("07"), "BB\r\r>");
}

TEST(Replay, expectedCountMakesNoDifference)
{
    auto host = replaying(kwp, "-> 01231\n<- 84F112412300412C\\r\\r>\n");
    host.ask("ATE0");
    EXPECT_EQ(host.ask("0123"), "84F112412300412C\r\r>");
    EXPECT_EQ(host.ask("01232"), "84F112412300412C\r\r>");
    auto codes = replaying(kwp, "-> 03\n<- 87F11843000000000000D3\\r\\r>\n");
    codes.ask("ATE0");
    EXPECT_EQ(codes.ask("031"), "87F11843000000000000D3\r\r>");
}

TEST(Replay, settingsOfRecordedCommandsTakeEffect)
{
    auto host = replaying(kwp, "-> ATE0\n<- OK\\r\\r>\n");
    EXPECT_EQ(host.ask("ATE0"), "ATE0\rOK\r\r>");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v2.3\r\r>");
}

TEST(Replay, adapterNameComesFromTheReplyOrTheHeader)
{
    EXPECT_EQ(replaying("adapter: a clone\nprotocol: 0\nheaders: off\n", "-> ATZ\n<- ATZ\\r\\r\\rELM327 v2.1\\r\\r>\n")
                  .ask("ATI"),
              "ATI\rELM327 v2.1\r\r>");
    EXPECT_EQ(replaying("adapter: clone, ELM327 v1.4, USB\nprotocol: 0\nheaders: off\n", "").ask("ATI"),
              "ATI\rELM327 v1.4\r\r>");
    EXPECT_EQ(replaying("adapter: not told\nprotocol: 0\nheaders: off\n", "").ask("ATI"), "ATI\rELM327 v1.5\r\r>");
}

struct BringUpCase
{
    char const* dialogue;
    char const* number;
    char const* reply; ///< first characters of the second reply to 0100
};

// Real cars that a driver can bring up from their recording alone.
BringUpCase const bringUpCases[] = {
    {"kwpfast-van-2005-stn", "A5", "86F1124100983B2013D0"},
    {"kwpfast-bmw-two-modules", "A5", "86 F1 18 41 00 80 18 00 11 79"},
    {"kwpfast-espace-empty-mask", "A5", "8"},
    {"can11-a180d-three-modules", "A6", "7EB06410098180001"},
    {"can29-four-modules-stray-frames", "A7", "18 DA F1 40 06 41 00 80 00 00 01"},
    {"iso9141-volvo-v40-2003-module-13", "A3", "48 6B 13 41 00 BE 1F B8 11 AD"},
    {"pwm-first-masks", "A1", "41 6B 10 41 00 BF 9F B9 90 05"},
};

TEST(Replay, realCarsComeUpWithTheCommandsOfADriver)
{
    for (auto const& row : bringUpCases) {
        auto host = recorded(row.dialogue);
        EXPECT_NE(host.ask("ATI").find("ELM327"), std::string::npos) << row.dialogue;
        for (char const* command : {"ATE0", "ATL0", "ATS0", "ATM0", "ATST64", "ATTP0"}) {
            EXPECT_NE(host.ask(command).find("OK"), std::string::npos) << row.dialogue << " " << command;
        }
        std::string const probe = host.ask("0100");
        EXPECT_NE(probe.find("41"), std::string::npos) << row.dialogue << ": " << probe;
        EXPECT_EQ(host.ask("ATDPN"), std::string(row.number) + "\r\r>") << row.dialogue;
        EXPECT_NE(host.ask("ATH1").find("OK"), std::string::npos) << row.dialogue;
        EXPECT_EQ(host.ask("0100").substr(0, std::string(row.reply).size()), row.reply) << row.dialogue;
    }
}

TEST(Replay, eachRepeatedRequestHasItsOwnReply)
{
    auto host = replaying(kwp, "-> 010C\n<- AA\\r\\r>\n-> 010C\n<- BB\\r\\r>\n-> 010C\n<- CC\\r\\r>\n");
    host.ask("ATE0");
    for (char const* const reply : {"AA", "BB", "CC", "CC"}) {
        EXPECT_EQ(host.ask("010C"), std::string(reply) + "\r\r>");
    }
}

TEST(Replay, whatIsToldOfTheProtocolBehindTheSearchIsTheRecordings)
{
    auto host = replaying("adapter: ELM327 v2.2\nprotocol: 6\nheaders: off\n",
                          "-> ATDP\n<- AUTO\\r\\r>\n-> 0100\n<- 4100BE3EA813\\r\\r>\n"
                          "-> ATDP\n<- AUTO,ISO 15765-4\\r\\r>\n");
    EXPECT_EQ(host.ask({"ATE0", "ATDP"}), "AUTO\r\r>");
    EXPECT_EQ(host.ask({"0100", "ATDP"}), "AUTO,ISO 15765-4\r\r>");
}

} // namespace
