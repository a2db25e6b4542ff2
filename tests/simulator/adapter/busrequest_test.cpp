#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Ms;
using obdsim::Time;

constexpr char const* twoModules = R"(
name = "Two modules"
protocol = 6
padding = "00"
[[module]]
id = "7E8"
latency = 10
[module.raw]
"0100" = "41 00 BE 3F A8 13"
"010D" = "41 0D 37"
"0902" = "49 02 01 31 4E 34 41 4C 33 41 50 37 44 30 30 30 30 30 30 30"
[[module]]
id = "7E9"
latency = 12
[module.raw]
"0100" = "41 00 98 18 00 11"
"0904" = "49 04 01 30 43 57 39 30 36 35 35 36 45 43 2B 30 35 36 32"
)";

Conversation ready(std::string const& toml, std::initializer_list<char const*> commands)
{
    auto host = withVehicle(toml, "elm327-v2.3");
    host.ask("ATE0");
    host.ask(commands);
    return host;
}

TEST(BusRequest, headersAndBlanksAreShownAsChosen)
{
    auto host = ready(twoModules, {"ATSP6"});
    EXPECT_EQ(host.ask("0100"), "41 00 BE 3F A8 13 \r41 00 98 18 00 11 \r\r>");
    EXPECT_EQ(host.ask({"ATS0", "0100"}), "4100BE3FA813\r410098180011\r\r>");
    EXPECT_EQ(host.ask({"ATH1", "0100"}), "7E8064100BE3FA81300\r7E90641009818001100\r\r>");
    EXPECT_EQ(host.ask({"ATS1", "0100"}), "7E8 06 41 00 BE 3F A8 13 00 \r7E9 06 41 00 98 18 00 11 00 \r\r>");
    EXPECT_EQ(host.ask({"ATD1", "010D"}), "7E8 8 03 41 0D 37 00 00 00 00 \r\r>");
}

TEST(BusRequest, longMessageHasLengthAndLineNumbersWithoutHeaders)
{
    auto host = ready(twoModules, {"ATS0", "ATSP6"});
    EXPECT_EQ(host.ask("0902"), "014\r0:490201314E34\r1:414C3341503744\r2:30303030303030\r\r>");
    EXPECT_EQ(host.ask({"ATS1", "0904"}), "013\r0: 49 04 01 30 43 57 \r1: 39 30 36 35 35 36 45 \r"
                                          "2: 43 2B 30 35 36 32 00 \r\r>");
    EXPECT_EQ(host.ask({"ATS0", "ATH1", "0902"}), "7E81014490201314E34\r7E821414C3341503744\r7E82230303030303030\r\r>");
}

TEST(BusRequest, framesOfTwoModulesMixByTheirTimes)
{
    constexpr char const* mixed = R"(
name = "Both long"
protocol = 6
padding = "00"
[[module]]
id = "7E8"
latency = 10
raw = { "0904" = "01 02 03 04 05 06 07 08" }
[[module]]
id = "7E9"
latency = 12
raw = { "0904" = "11 12 13 14 15 16 17 18" }
)";
    auto host = ready(mixed, {"ATS0", "ATH1", "ATSP6"});
    EXPECT_EQ(host.ask("0904"), "7E81008010203040506\r7E91008111213141516\r7E8210708000000000"
                                "0\r7E92117180000000000\r\r>");
}

TEST(BusRequest, expectedCountEndsTheWaiting)
{
    auto host = ready(twoModules, {"ATS0", "ATSP6"});
    host.ask("0100");
    Time const whole = host.lastWait();
    EXPECT_EQ(host.ask("01001"), "4100BE3FA813\r\r>");
    EXPECT_LT(host.lastWait(), whole);
    EXPECT_EQ(host.ask("01002"), "4100BE3FA813\r410098180011\r\r>");
    EXPECT_EQ(host.ask("09021"), "014\r0:490201314E34\r\r>") << "one frame of the message is one answer";
}

TEST(BusRequest, silenceLastsAsLongAsTheTimeOut)
{
    auto host = ready(twoModules, {"ATS0", "ATSP6", "ATST64"});
    EXPECT_EQ(host.ask("015C"), "NO DATA\r\r>");
    Time const before = std::chrono::microseconds(4222); // the adapter's own time, and a frame of 111 bits
    EXPECT_EQ(host.lastWait(), before + 0x64 * std::chrono::microseconds(4096));
    host.ask({"ATST19", "015C"});
    EXPECT_EQ(host.lastWait(), before + 0x19 * std::chrono::microseconds(4096));
    host.ask({"ATST00", "015C"});
    EXPECT_EQ(host.lastWait(), before + 0x32 * std::chrono::microseconds(4096)) << "00 is the default";
}

TEST(BusRequest, moduleSlowerThanTheTimeOutIsNotHeard)
{
    constexpr char const* slow = R"(
name = "Slow"
protocol = 6
[[module]]
id = "7E8"
latency = 300
raw = { "010D" = "41 0D 37" }
)";
    auto host = ready(slow, {"ATS0", "ATSP6", "ATST32"});
    EXPECT_EQ(host.ask("010D"), "NO DATA\r\r>");
    host.pass(Ms(200));
    EXPECT_EQ(host.ask({"ATSTFF", "010D"}), "410D37\r\r>");
    EXPECT_EQ(host.ask({"ATST32", "010D"}), "NO DATA\r\r>");
    EXPECT_EQ(host.ask({"ATSTFF", "010D"}), "410D37\r410D37\r\r>") << "a late reply answers the next request";
}

constexpr char const* busy = R"(
name = "Busy"
protocol = 6
padding = "00"
[[module]]
id = "7E8"
latency = 10
raw = { "0904" = "49 04 00" }
[module.delays]
"0904" = { times = 2, milliseconds = 180 }
)";

TEST(BusRequest, pendingAnswerKeepsTheAdapterWaiting)
{
    auto host = ready(busy, {"ATS0", "ATH1", "ATSP6"});
    EXPECT_EQ(host.ask("0904"), "7E8037F097800000000\r7E8037F097800000000\r7E80349040000000000\r\r>");
    EXPECT_GE(host.lastWait(), Ms(370));
}

TEST(BusRequest, pendingAnswerIsAwaitedBehindThatOfAnotherModule)
{
    std::string const other = R"(
[[module]]
id = "7E9"
latency = 40
raw = { "0904" = "49 04 01" }
)";
    auto host = ready(busy + other, {"ATS0", "ATH1", "ATSP6"});
    EXPECT_EQ(host.ask("0904"), "7E8037F097800000000\r7E90349040100000000\r"
                                "7E8037F097800000000\r7E80349040000000000\r\r>");
}

TEST(BusRequest, filtersLetOneModuleThrough)
{
    auto host = ready(twoModules, {"ATS0", "ATSP6", "ATCF7E9", "ATCM7FF"});
    EXPECT_EQ(host.ask("0100"), "410098180011\r\r>");
    EXPECT_EQ(host.ask({"ATAR", "0100"}), "4100BE3FA813\r410098180011\r\r>");
    EXPECT_EQ(host.ask({"ATCRA7E8", "0100"}), "4100BE3FA813\r\r>");
    EXPECT_EQ(host.ask({"ATCRA", "0100"}), "4100BE3FA813\r410098180011\r\r>");
}

TEST(BusRequest, headerOfOneModuleReachesThatModule)
{
    auto host = ready(twoModules, {"ATS0", "ATSP6", "ATSH7E1"});
    EXPECT_EQ(host.ask("0100"), "410098180011\r\r>");
    EXPECT_EQ(host.ask({"ATSH7DF", "010D"}), "410D37\r\r>");
    EXPECT_EQ(host.ask({"ATSH0007E0", "010D"}), "410D37\r\r>");
    EXPECT_EQ(host.ask({"ATSH7B0", "010D"}), "NO DATA\r\r>");
}

TEST(BusRequest, formattingOffWantsAndShowsPciBytes)
{
    auto host = ready(twoModules, {"ATS0", "ATSP6", "ATCAF0"});
    EXPECT_EQ(host.ask("010D"), "NO DATA\r\r>") << "no PCI byte was sent";
    EXPECT_EQ(host.ask("02010D"), "03410D3700000000\r\r>");
}

TEST(BusRequest, withoutFlowControlOnlyTheFirstFrameComes)
{
    auto host = ready(twoModules, {"ATS0", "ATH1", "ATSP6", "ATCFC0"});
    EXPECT_EQ(host.ask("0902"), "7E81014490201314E34\r\r>");
}

TEST(BusRequest, responsesOffEndsAtOnce)
{
    auto host = ready(twoModules, {"ATSP6", "ATR0"});
    EXPECT_EQ(host.ask("010D"), "\r>");
}

TEST(BusRequest, tooLongRequestIsRefused)
{
    auto host = ready(twoModules, {"ATSP6"});
    EXPECT_EQ(host.ask("010203040506070809"), "?\r\r>");
    EXPECT_EQ(host.ask("01 0G"), "?\r\r>");
}

struct SearchCase
{
    char const* vehicle;
    int number;
    char const* description;
    char const* reply; ///< to 0100 with headers, first characters
};

SearchCase const searchCases[] = {
    {"petrol-pwm", 1, "SAE J1850 PWM", "41 6B 10 41 00 "},
    {"petrol-vpw", 2, "SAE J1850 VPW", "48 6B 10 41 00 "},
    {"petrol-iso9141", 3, "ISO 9141-2", "48 6B 10 41 00 "},
    {"petrol-kwp-slow", 4, "ISO 14230-4 (KWP 5BAUD)", "86 F1 10 41 00 "},
    {"petrol-kwp-fast", 5, "ISO 14230-4 (KWP FAST)", "86 F1 11 41 00 "},
    {"petrol-can11", 6, "ISO 15765-4 (CAN 11/500)", "7E8 06 41 00 "},
    {"diesel-can29", 7, "ISO 15765-4 (CAN 29/500)", "18 DA F1 10 06 41 00 "},
    {"petrol-can11-250", 8, "ISO 15765-4 (CAN 11/250)", "7E8 06 41 00 "},
    {"petrol-can29-250", 9, "ISO 15765-4 (CAN 29/250)", "18 DA F1 10 06 41 00 "},
};

TEST(ProtocolSearch, findsEachOfTheNine)
{
    for (auto const& row : searchCases) {
        for (char const* automatic : {"ATSP0", "ATTP0"}) {
            auto host = simulated(row.vehicle);
            std::string const reply = host.ask({"ATE0", automatic, "ATH1", "0100"});
            EXPECT_EQ(reply.substr(0, 13), "SEARCHING...\r") << row.vehicle;
            EXPECT_EQ(reply.substr(13, std::string(row.reply).size()), row.reply) << row.vehicle;
            EXPECT_LT(host.lastWait(), Ms(10000)) << row.vehicle;
            EXPECT_EQ(host.ask("ATDPN"), "A" + std::to_string(row.number) + "\r\r>");
            EXPECT_EQ(host.ask("ATDP"), std::string("AUTO, ") + row.description + "\r\r>");
            EXPECT_EQ(host.ask("0100").substr(0, std::string(row.reply).size()), row.reply) << "no second search";
        }
    }
}

TEST(BusRequest, receiverAddressOfALineIsChosenAndLeftToTheAdapterAgain)
{
    auto host = simulated("petrol-iso9141");
    host.ask({"ATE0", "ATS0", "ATSP3", "0100"});
    EXPECT_EQ(host.ask({"ATSR99", "0100"}), "NO DATA\r\r>");
    EXPECT_EQ(host.ask({"ATAR", "0100"}), "4100BE3EB811\r\r>");
}

TEST(ProtocolSearch, startsTheBusOfAChosenProtocol)
{
    EXPECT_EQ(simulated("petrol-iso9141").ask({"ATE0", "ATS0", "ATSP3", "0100"}), "BUS INIT: ...OK\r4100BE3EB811\r\r>");
    EXPECT_EQ(simulated("petrol-kwp-slow").ask({"ATE0", "ATS0", "ATTP4", "0100"}).substr(0, 16), "BUS INIT: ...OK\r");
    EXPECT_EQ(simulated("petrol-kwp-fast").ask({"ATE0", "ATS0", "ATTP5", "0100"}).substr(0, 13), "BUS INIT: OK\r");
    EXPECT_EQ(simulated("petrol-vpw").ask({"ATE0", "ATS0", "ATTP2", "0100"}).substr(0, 4), "4100");
}

TEST(ProtocolSearch, spaTriesTheRestWhenTheChosenOneFails)
{
    auto host = simulated("petrol-vpw");
    EXPECT_EQ(host.ask({"ATE0", "ATSPA6", "0100"}).substr(0, 13), "SEARCHING...\r");
    EXPECT_EQ(host.ask("ATDPN"), "A2\r\r>");
}

struct WrongCase
{
    char const* vehicle;
    char const* protocol;
    char const* reply;
};

WrongCase const wrongCases[] = {
    {"petrol-vpw", "ATSP6", "CAN ERROR"},
    {"petrol-can11", "ATSP8", "CAN ERROR"},
    {"petrol-can11", "ATSP7", "NO DATA"},
    {"petrol-can11", "ATSPA", "CAN ERROR"},
    {"petrol-can11", "ATSP1", "NO DATA"},
    {"petrol-can11", "ATSP2", "NO DATA"},
    {"petrol-can11", "ATSP3", "BUS INIT: ...ERROR"},
    {"petrol-can11", "ATSP4", "BUS INIT: ...ERROR"},
    {"petrol-can11", "ATSP5", "BUS INIT: ERROR"},
    {"petrol-kwp-fast", "ATSP4", "BUS INIT: ...ERROR"},
};

TEST(ProtocolSearch, wrongChosenProtocolGivesTheErrorsOfTheChip)
{
    for (auto const& row : wrongCases) {
        auto host = simulated(row.vehicle);
        EXPECT_EQ(host.ask({"ATE0", row.protocol, "0100"}), std::string(row.reply) + "\r\r>") << row.protocol;
        EXPECT_EQ(host.ask("0100"), std::string(row.reply) + "\r\r>") << "again";
    }
}

TEST(ProtocolSearch, withoutACarNothingIsFound)
{
    auto host = unplugged();
    EXPECT_EQ(host.ask({"ATE0", "0100"}), "SEARCHING...\rUNABLE TO CONNECT\r\r>");
    EXPECT_EQ(host.ask("ATDPN"), "A0\r\r>");
    EXPECT_EQ(host.ask({"ATSPA8", "0100"}), "SEARCHING...\rUNABLE TO CONNECT\r\r>");
}

TEST(ProtocolSearch, resetForgetsATriedProtocolButNotAChosenOne)
{
    auto host = unplugged();
    EXPECT_EQ(host.ask({"ATE0", "ATTP6", "ATZ", "ATE0", "ATDPN"}), "A0\r\r>");
    EXPECT_EQ(host.ask({"ATSP6", "ATTP3", "ATD", "ATE0", "ATDPN"}), "6\r\r>");
    auto diamex = unplugged("diamex");
    EXPECT_EQ(diamex.ask({"ATE0", "ATPA6", "ATZ", "ATE0", "ATN"}), "A0\r\r>");
    EXPECT_EQ(diamex.ask({"ATP6", "ATZ", "ATE0", "ATN"}), "6\r\r>");
}

TEST(ProtocolSearch, closedBusIsStartedAnew)
{
    auto host = simulated("petrol-kwp-fast");
    host.ask({"ATE0", "ATSP5", "0100"});
    EXPECT_EQ(host.ask("ATKW"), "1:E9 2:8F\r\r>");
    EXPECT_EQ(host.ask({"ATPC", "0100"}).substr(0, 13), "BUS INIT: OK\r");
    EXPECT_EQ(host.ask("ATFI"), "BUS INIT: OK\r\r>");
    EXPECT_EQ(host.ask("ATSI"), "BUS INIT: ...ERROR\r\r>");
}

TEST(BusRequest, moduleThatWaitsLongBeforeItsInvertedAddressOpensTheBusLater)
{
    Conversation quick = simulated("petrol-iso9141");
    Conversation slow = simulated("two-iso9141");
    EXPECT_EQ(quick.ask({"ATE0", "ATSP3", "ATSI"}), "BUS INIT: ...OK\r\r>");
    EXPECT_EQ(slow.ask({"ATE0", "ATSP3", "ATSI"}), "BUS INIT: ...OK\r\r>");
    EXPECT_EQ(slow.lastWait() - quick.lastWait(), obdsim::Ms(25));
}

} // namespace
