// The waits of an adapter, the times of its buses and its line, and how it counts replies: by the ELM327 data sheets.
#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Ms;
using obdsim::Time;

constexpr char const* fastAndSlow = R"(
name = "Modules of 4 and 58 ms"
protocol = 6
[[module]]
id = "7E8"
latency = 4
frame_gap = 0
raw = { "0100" = "41 00 98 18 00 11", "010D" = "41 0D 37", "0902" = "49 02 01 31 4E 34 41 4C 33 41 50 37 44" }
[[module]]
id = "7E9"
latency = 58
raw = { "0100" = "41 00 98 18 00 11" }
)";

Conversation quiet(std::string const& toml, std::string const& adapter = "elm327-v2.3", obdsim::Quirks quirks = {})
{
    auto host = withVehicle(toml, adapter, quirks);
    host.ask({"ATE0", "ATS0", "ATH1", "ATSP6"});
    return host;
}

double waitAfter(Conversation& host, std::string const& request)
{
    host.ask(request);
    return std::chrono::duration<double, std::milli>(host.lastWait()).count();
}

TEST(ReplyTimer, waitsHalfAsLongAgainAsTheSlowestReply)
{
    auto host = quiet(fastAndSlow);
    double const slowest = 58 + 0.222;
    EXPECT_NEAR(waitAfter(host, "0100"), 4.2 + 58 + 0.3 + 204.8, 1) << "nothing is learnt yet";
    EXPECT_NEAR(waitAfter(host, "0100"), 4.2 + 58 + 0.3 + 1.5 * slowest, 1) << "replies at 4 and 58 ms: 90 ms";
    EXPECT_NEAR(waitAfter(host, "010D"), 4.2 + 4 + 0.3 + 1.5 * slowest, 1) << "learnt";
    host.ask("ATAT2");
    EXPECT_NEAR(waitAfter(host, "0100"), 4.2 + 58 + 0.3 + 1.2 * slowest, 1);
    host.ask("ATAT0");
    EXPECT_NEAR(waitAfter(host, "010D"), 4.2 + 4 + 0.3 + 204.8, 1) << "all of ATST";
    host.ask({"ATAT1", "ATST10"});
    EXPECT_NEAR(waitAfter(host, "0100"), 4.2 + 58 + 0.3 + 16 * 4.096, 1) << "never above ATST";
}

TEST(CommandTimes, resetsAndWhatIsStoredTakeLonger)
{
    auto host = quiet(fastAndSlow);
    for (char const* command : {"ATSP6", "ATSD7F", "ATPP0CSV23", "ATPP0CON", "ATCV1234", "AT@3123456789012"}) {
        EXPECT_NEAR(waitAfter(host, command), 34, 1) << command;
    }
    for (char const* command : {"ATTP6", "ATST64", "ATRV", "ATRD"}) {
        EXPECT_NEAR(waitAfter(host, command), 4, 1) << command;
    }
    EXPECT_NEAR(waitAfter(host, "ATWS"), 6, 1);
    EXPECT_NEAR(waitAfter(host, "ATZ"), 804, 1);
}

TEST(ReplyTimer, firstReplyHasAllTheTime)
{
    auto host = quiet(fastAndSlow);
    host.ask({"ATSH7E0", "010D"});
    EXPECT_NEAR(waitAfter(host, "010D"), 4.2 + 4.2 + 1.5 * 4.2, 1);
    EXPECT_EQ(host.ask({"ATSH7E1", "0100"}), "7E90641009818001100\r\r>");
}

TEST(ReplyTimer, restOfAMessageHasAllTheTimeHoweverFastTheModuleIs)
{
    constexpr char const* hasty = R"(
name = "A module of 1 ms that leaves 30 ms between its frames"
protocol = 6
[[module]]
id = "7E8"
latency = 1
frame_gap = 30
raw = { "010D" = "41 0D 37", "0902" = "49 02 01 31 4E 34 41 4C 33 41 50 37 44" }
)";
    auto host = quiet(hasty);
    host.ask({"010D", "010D"});
    EXPECT_EQ(host.ask("0902"), "7E8100D490201314E34\r7E821414C3341503744\r\r>");
    double const wait = waitAfter(host, "010D");
    EXPECT_NEAR(wait, 4.2 + 1 + 0.3 + 1.5 * 1.2, 1) << "single frames are awaited as briefly as before";
    host.ask("ATCFC0");
    EXPECT_EQ(host.ask("0902"), "7E8100D490201314E34\r\r>") << "without flow control no more is promised";
    EXPECT_LT(host.lastWait(), Ms(50));
}

TEST(ReplyTimer, stnWaitsHalfAsLongByItself)
{
    auto host = quiet(fastAndSlow, "stn2120");
    EXPECT_NEAR(waitAfter(host, "015C"), 4.2 + 25 * 4.096, 0.1);
}

TEST(ReplyTimer, pendingAnswerIsAwaitedByTheNewerChips)
{
    constexpr char const* slow = R"(
name = "Slow"
protocol = 6
[[module]]
id = "7E8"
latency = 10
raw = { "0904" = "49 04 00" }
delays = { "0904" = { times = 1, milliseconds = 2000 } }
)";
    EXPECT_EQ(quiet(slow).ask("0904"), "7E8037F097800000000\r7E80349040000000000\r\r>");
    auto old = quiet(slow, "elm327-v1.4");
    EXPECT_EQ(old.ask("0904"), "7E8037F097800000000\r\r>");
    old.pass(Ms(1700));
    EXPECT_EQ(old.ask("015C1"), "7E80349040000000000\r\r>") << "what came too late is the next reply";
}

TEST(CountDigit, countsFramesOfAllModules)
{
    auto host = quiet(fastAndSlow);
    host.ask("0100");
    EXPECT_EQ(host.ask("01001"), "7E80641009818001100\r\r>");
    EXPECT_LT(host.lastWait(), Ms(10));
    host.pass(Ms(60));
    EXPECT_EQ(host.ask("01002"), "7E80641009818001100\r7E90641009818001100\r\r>");
    EXPECT_NEAR(waitAfter(host, "01002"), 62.7, 0.5);
    EXPECT_GT(waitAfter(host, "01003"), 100) << "one more than come: the whole wait";
    EXPECT_GT(waitAfter(host, "01000"), 100) << "the digit 0 means nothing";
}

TEST(CountDigit, cutMessageGoesOnInTheNextReply)
{
    auto host = quiet(fastAndSlow);
    EXPECT_EQ(host.ask("09021"), "7E8100D490201314E34\r\r>");
    EXPECT_EQ(host.ask("010D1"), "7E803410D3700000000\r\r>") << "its rest had passed before the next request";
    constexpr char const* slowFrames = R"(
name = "Slow frames"
protocol = 6
[[module]]
id = "7E8"
latency = 4
frame_gap = 20
raw = { "010D" = "41 0D 37", "0902" = "49 02 01 31 4E 34 41 4C 33 41 50 37 44" }
)";
    auto slow = quiet(slowFrames);
    EXPECT_EQ(slow.ask({"ATAT0", "09021"}), "7E8100D490201314E34\r\r>");
    EXPECT_EQ(slow.ask("010D2"), "7E803410D3700000000\r7E821414C3341503744\r\r>");
}

TEST(CountDigit, clonesCountMessagesRefuseOrIgnoreIt)
{
    auto messages = quiet(fastAndSlow, "elm327-v2.3", {obdsim::Quirk::CountMessages});
    EXPECT_EQ(messages.ask("09021"), "7E8100D490201314E34\r7E821414C3341503744\r\r>");
    EXPECT_LT(messages.lastWait(), Ms(15));
    auto ignoring = quiet(fastAndSlow, "elm327-v2.3", {obdsim::Quirk::CountIgnored});
    EXPECT_EQ(ignoring.ask("01001"), "7E80641009818001100\r7E90641009818001100\r\r>");
    auto refusing = quiet(fastAndSlow, "clone-v2.1-poor");
    EXPECT_EQ(refusing.ask("01001"), "?\r\r>");
}

TEST(SeveralPids, modulesTakeThemRefuseOrAnswerTheFirst)
{
    std::string const module = R"(
name = "Choosy"
protocol = 6
[[module]]
id = "7E8"
most_pids = 2
fixed = { "1C" = "06", "13" = "03", "51" = "01" }
)";
    EXPECT_EQ(quiet(module).ask("011C13511"), "7E805411C0613030000\r\r>") << "as many as it takes";
    EXPECT_EQ(quiet(module + "more_pids = \"refuse\"\n").ask("011C1351"), "7E8037F011200000000\r\r>");
    EXPECT_EQ(quiet(module + "more_pids = \"silence\"\n").ask("011C1351"), "NO DATA\r\r>");
    EXPECT_EQ(quiet(module + "more_pids = \"refuse\"\n").ask("011C13"), "7E805411C0613030000\r\r>");
    auto cut = quiet(module, "elm327-v2.3", {obdsim::Quirk::RequestCut});
    EXPECT_EQ(cut.ask("011C1351"), "7E803411C0600000000\r\r>") << "two bytes went out";
}

TEST(SeveralPids, requestOfEightBytesNeedsLongMessages)
{
    auto host = quiet(fastAndSlow);
    EXPECT_EQ(host.ask("0101020304050607"), "?\r\r>");
    EXPECT_EQ(host.ask({"ATAL", "0101020304050607"}), "NO DATA\r\r>");
    EXPECT_EQ(host.ask({"ATNL", "0101020304050607"}), "?\r\r>");
}

TEST(PaddingCut, cloneCutsSingleFramesWithHeadersOn)
{
    auto host = quiet(fastAndSlow, "elm327-v1.5");
    EXPECT_EQ(host.ask("010D"), "7E803410D37\r\r>");
    EXPECT_EQ(host.ask("0902"), "7E8100D490201314E34\r7E821414C3341503744\r\r>");
}

/// Requests in a row, as fast as the prompts come; how many in a second.
double requestsPerSecond(Conversation& host, std::string const& request)
{
    constexpr int count = 50;
    Time const start = host.peer().now();
    for (int i = 0; i < count; ++i) {
        host.ask(request);
    }
    return count / std::chrono::duration<double>(host.peer().now() - start).count();
}

struct RateCase
{
    char const* vehicle;
    std::vector<std::string> faults;
    std::string request;
    double least;
    double most;
};

TEST(Rates, areThoseOfBusModuleAndLine)
{
    RateCase const cases[] = {
        // P3 stands before each request, P4 between its bytes: SAE J1979 on a K line cannot be faster.
        {"petrol-kwp-fast", {}, "010C1", 7, 8.4},
        {"petrol-iso9141", {}, "010C1", 6, 8.4},
        {"petrol-vpw", {}, "010C1", 20, 80},
        // A module of 10 ms at 38400 and 115200 baud, with count digit: 17.8 and 12.9 ms.
        {"bench-can11", {"command=0", "baud=38400"}, "010C1", 50, 57},
        {"bench-can11", {"command=0", "baud=115200"}, "010C1", 68, 78},
        {"bench-can11", {"command=0"}, "010C1", 85, 96},
        {"bench-can11", {"command=0", "baud=38400", "wait=50"}, "010C", 13, 16},
        {"bench-can11", {"command=0", "baud=38400", "wait=400"}, "010C", 2.3, 2.5},
        {"bench-can11", {"command=0", "baud=38400"}, "010C0D0504110F3", 28, 32},
        {"bench-can11", {"command=0", "baud=115200"}, "010C0D0504110F3", 50, 58},
    };
    for (auto const& row : cases) {
        auto host = simulated(row.vehicle, "elm327-v2.3", row.faults);
        host.ask({"ATE0", "ATS0", "ATH1", "ATSP0", "0100"});
        double const rate = requestsPerSecond(host, row.request);
        EXPECT_GE(rate, row.least) << row.vehicle << " " << row.request << testing::PrintToString(row.faults);
        EXPECT_LE(rate, row.most) << row.vehicle << " " << row.request << testing::PrintToString(row.faults);
    }
}

TEST(Timing, lineIsLeftAloneBehindARequestThatNobodyAnswers)
{
    auto host = simulated("petrol-iso9141");
    host.ask({"ATE0", "ATSP3", "0100", "ATAT0", "ATST01"});
    host.pass(Ms(1000));
    EXPECT_EQ(host.ask("01AA"), "NO DATA\r\r>");
    Time const alone = host.lastWait();
    EXPECT_EQ(host.ask("01AA"), "NO DATA\r\r>");
    EXPECT_GT(host.lastWait(), alone + Ms(40)) << "P3";
}

TEST(LineRate, whatWasUnderWayIsLostWithTheConnection)
{
    auto host = simulated("petrol-can11", "elm327-v1.5", {"baud=9600"});
    host.ask("ATE0");
    host.peer().receive("AT@1\r");
    host.peer().connect();
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
}

TEST(LineRate, aLineThatHasBegunIsLostWithTheConnection)
{
    auto host = simulated("petrol-can11", "elm327-v1.5", {"baud=9600"});
    host.ask("ATE0");
    host.peer().receive("AT");
    host.pass(Ms(20));
    host.peer().connect();
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
}

TEST(Timing, aReplyTakesItsFramesTheModuleAndTheCommand)
{
    auto host = quiet(fastAndSlow);
    host.ask("0100");
    EXPECT_EQ(host.ask("010D1"), "7E803410D3700000000\r\r>");
    EXPECT_EQ(host.lastWait(), Ms(4) + Ms(4) + 2 * std::chrono::microseconds(222)) << "to the microsecond";
}

TEST(Timing, aBusThatNobodyAnswersOnTakesItsProbe)
{
    struct Probe
    {
        char const* protocol;
        char const* told;
        int milliseconds;
    };
    for (auto const& each :
         {Probe{"1", "NO DATA", 120}, Probe{"2", "NO DATA", 120}, Probe{"3", "BUS INIT: ...ERROR", 2500},
          Probe{"4", "BUS INIT: ...ERROR", 2500}, Probe{"5", "BUS INIT: ERROR", 400}, Probe{"6", "CAN ERROR", 150},
          Probe{"7", "CAN ERROR", 150}, Probe{"8", "CAN ERROR", 150}, Probe{"9", "CAN ERROR", 150},
          Probe{"A", "CAN ERROR", 100}, Probe{"B", "CAN ERROR", 100}, Probe{"C", "CAN ERROR", 100}}) {
        auto host = unplugged();
        host.ask({"ATE0", ("ATSP" + std::string(each.protocol)).c_str()});
        EXPECT_EQ(host.ask("0100"), std::string(each.told) + "\r\r>") << each.protocol;
        EXPECT_EQ(host.lastWait(), Ms(4 + each.milliseconds)) << each.protocol;
    }
    auto host = unplugged();
    EXPECT_EQ(host.ask({"ATE0", "ATSPD"}), "?\r\r>") << "there is none beyond C";
    EXPECT_EQ(host.ask({"ATSPA", "ATDP"}), "SAE J1939 (CAN 29/250)\r\r>");
    EXPECT_EQ(host.ask({"ATSPB", "ATDP"}), "USER1 (CAN 11/125)\r\r>");
    EXPECT_EQ(host.ask({"ATSPC", "ATDP"}), "USER2 (CAN 11/50)\r\r>");
    EXPECT_EQ(host.ask("ATDPN"), "C\r\r>");
}

TEST(Timing, framesOfALongMessageAreAsFarApartAsUsualOnTheirBus)
{
    struct Gap
    {
        int protocol;
        char const* id;
        int microsecondsOfTwoFrames; ///< between the first two lines of a message
    };
    for (auto const& each : {Gap{6, "7E8", 222 + 2000 + 222 + 2 * 2000},
                             Gap{7, "18DAF110", 262 + 2000 + 262 + 2 * 2000},
                             Gap{8, "7E8", 444 + 3000 + 444 + 2 * 3000},
                             Gap{9, "18DAF110", 524 + 3000 + 524 + 2 * 3000},
                             Gap{1, "10", 10000 + 11 * 192},
                             Gap{2, "10", 20000 + 11 * 769},
                             {3, "10", 30000 + 11 * 962},
                             {4, "10", 30000 + 11 * 962},
                             Gap{5, "10", 30000 + 11 * 962}}) {
        std::string const protocol = std::to_string(each.protocol);
        auto host = withVehicle("name = \"x\"\nprotocol = " + protocol + "\n[[module]]\nid = \"" + each.id +
                                    "\"\nlatency = 4\n[module.info]\nvin = \"WDX-SIM0019212345\"\n",
                                "elm327-v2.3");
        host.ask({"ATE0", "ATS0", "ATH1", "ATAT0", ("ATSP" + protocol).c_str()});
        host.ask("0902");
        host.pass(Ms(500));
        host.ask("09021");
        Time const first = host.lastWait();
        host.pass(Ms(500));
        host.ask("09022");
        EXPECT_EQ((host.lastWait() - first).count(), each.microsecondsOfTwoFrames) << each.protocol;
        host.pass(Ms(500));
    }
}

} // namespace
