// How an adapter comes to a bus: the search, the wake-up of a K line, and what is forgotten when a bus is closed.
#include "simulator/simulatedcar.h"
#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Ms;
using obdsim::Quirk;
using obdsim::Time;
using std::chrono::microseconds;

std::string car(int protocol, std::string const& more = {})
{
    bool const short11 = protocol == 6 || protocol == 8;
    std::string const id = short11 ? "7E8" : protocol > 5 ? "18DAF110" : "10";
    return "name = \"Car\"\nprotocol = " + std::to_string(protocol) + "\n" + more + "[[module]]\nid = \"" + id +
           "\"\nlatency = 10\nraw = { \"0100\" = \"41 00 BE 1F B8 10\", \"010D\" = \"41 0D 37\" }\n";
}

/// When each text of the reply comes, behind the command.
std::vector<std::pair<Time, std::string>> timesOf(Conversation& host, std::string const& command)
{
    std::vector<std::pair<Time, std::string>> all;
    host.peer().receive(command + "\r");
    Time const start = host.peer().now();
    while (auto const next = host.peer().nextOutput()) {
        all.emplace_back(*next - start, host.peer().advanceTo(*next));
    }
    return all;
}

TEST(BusStart, aSearchTriesOneBusBehindTheOther)
{
    constexpr int can = 150;
    constexpr int j1850 = 120;
    for (auto const& [protocol, milliseconds] : {std::pair{6, can},
                                                 {7, 2 * can},
                                                 {8, 3 * can},
                                                 {9, 4 * can},
                                                 {1, 4 * can + j1850},
                                                 {2, 4 * can + 2 * j1850},
                                                 {3, 4 * can + 2 * j1850 + 2500},
                                                 {5, 4 * can + 2 * j1850 + 2500 + 400},
                                                 {4, 4 * can + 2 * j1850 + 2500 + 400 + 2500}}) {
        auto host = withVehicle(car(protocol), "elm327-v2.3");
        host.ask("ATE0");
        auto const said = timesOf(host, "0100");
        ASSERT_GE(said.size(), 2U);
        EXPECT_EQ(said[0], std::pair(Time(Ms(4)), std::string("SEARCHING...")));
        EXPECT_EQ(said[1].first, Ms(4 + milliseconds)) << protocol;
    }
    auto host = unplugged();
    host.ask({"ATE0", "0100"});
    EXPECT_EQ(host.lastWait(), Ms(4 + 4 * can + 2 * j1850 + 2500 + 400 + 2500));
}

TEST(BusStart, aFiveBaudAddressHasItsDots)
{
    auto host = withVehicle(car(3));
    host.ask({"ATE0", "ATSP3"});
    auto const said = timesOf(host, "ATPC");
    auto const woken = timesOf(host, "0100");
    ASSERT_GE(woken.size(), 5U);
    EXPECT_EQ(woken[0], std::pair(Time(Ms(4)), std::string("BUS INIT: ")));
    for (std::size_t i = 1; i <= 3; ++i) {
        EXPECT_EQ(woken[i], std::pair(Time(Ms(4 + 625 * static_cast<int>(i))), std::string("."))) << i;
    }
    EXPECT_EQ(woken[4], std::pair(Time(Ms(4 + 2500)), std::string("OK\r")));
    EXPECT_EQ(said.back().first, Ms(4));
}

TEST(BusStart, theCarsPauseIsThatOfAFiveBaudAddressAlone)
{
    auto fast = withVehicle(car(5, "w4 = 50\n"));
    fast.ask({"ATE0", "ATSP5", "ATFI"});
    EXPECT_EQ(fast.lastWait(), Ms(4 + 400));
}

TEST(BusStart, aBusWithoutAWakeUpHasNone)
{
    for (char const* const command : {"ATSI", "ATFI"}) {
        EXPECT_EQ(withVehicle(car(6)).ask({"ATE0", command}), "?\r\r>") << "none is chosen";
        EXPECT_EQ(withVehicle(car(6)).ask({"ATE0", "ATSP6", command}), "?\r\r>");
        EXPECT_EQ(withVehicle(car(1)).ask({"ATE0", "ATSP1", command}), "?\r\r>");
        EXPECT_EQ(withVehicle(car(6)).ask({"ATE0", "ATSPB", command}), "?\r\r>");
    }
    EXPECT_EQ(unplugged().ask({"ATE0", "ATSP5", "ATFI"}), "BUS INIT: ERROR\r\r>");
}

TEST(BusStart, keyWordsAreThoseOfTheBusThatIsAwake)
{
    EXPECT_EQ(withVehicle(car(5)).ask({"ATE0", "ATSP5", "ATKW"}), "1:-- 2:--\r\r>");
    EXPECT_EQ(withVehicle(car(5)).ask({"ATE0", "ATSP5", "ATFI", "ATKW"}), "1:E9 2:8F\r\r>");
    EXPECT_EQ(withVehicle(car(3)).ask({"ATE0", "ATSP3", "ATSI", "ATKW"}), "1:08 2:08\r\r>");
    EXPECT_EQ(withVehicle(car(6)).ask({"ATE0", "ATSP6", "0100", "ATKW"}), "1:-- 2:--\r\r>");
    EXPECT_EQ(withVehicle(car(6)).ask({"ATE0", "ATKW"}), "1:-- 2:--\r\r>");
}

TEST(BusStart, aRequestWithoutResponsesEndsBehindTheWakeUp)
{
    EXPECT_EQ(withVehicle(car(5)).ask({"ATE0", "ATSP5", "ATR0", "0100"}), "BUS INIT: OK\r\r>");
    EXPECT_EQ(withVehicle(car(6)).ask({"ATE0", "ATR0", "0100"}), "SEARCHING...\r\r>");
}

TEST(BusStart, cloneThatSplitsTheWakeUpDoesSoOnceForAChosenBus)
{
    auto searching = withVehicle(car(5), "elm327-v2.3", {Quirk::BusInitSplit});
    EXPECT_EQ(searching.ask({"ATE0", "ATS0", "0100"}), "SEARCHING...\r4100BE1FB810\r\r>");
    auto chosen = withVehicle(car(5), "elm327-v2.3", {Quirk::BusInitSplit});
    EXPECT_EQ(chosen.ask({"ATE0", "ATS0", "ATSP5", "0100"}), "BUS INIT: OK\r");
    chosen.pass(Ms(500));
    EXPECT_EQ(chosen.ask("0100"), "4100BE1FB810\r\r>");
    EXPECT_EQ(withVehicle(car(5), "elm327-v2.3", {Quirk::BusInitSplit}).ask({"ATE0", "ATSP4", "0100"}),
              "BUS INIT: ...ERROR\r\r>");
}

TEST(BusStart, cloneThatLosesTheFirstReplyDoesSoOnEachBusThatIsStarted)
{
    auto host = withVehicle(car(6), "elm327-v2.3", {Quirk::FirstNoData});
    EXPECT_EQ(host.ask({"ATE0", "ATS0", "ATSP6", "010D"}), "NO DATA\r\r>");
    EXPECT_EQ(host.lastWait(), Ms(4) + 50 * microseconds(4096)) << "the whole time";
    EXPECT_EQ(host.ask("010D"), "410D37\r\r>");
    EXPECT_EQ(host.ask({"ATPC", "010D"}), "NO DATA\r\r>");
    EXPECT_EQ(host.ask("010D"), "410D37\r\r>");
}

TEST(BusStart, whatWasLearntIsForgottenWithTheBus)
{
    auto host = withVehicle(car(6), "elm327-v2.3");
    host.ask({"ATE0", "ATSP6", "010D"});
    Time const first = host.lastWait();
    host.ask("010D");
    EXPECT_LT(host.lastWait(), first);
    host.ask({"ATPC", "010D"});
    EXPECT_EQ(host.lastWait(), first);
}

TEST(BusStart, aCarThatSleepsAcknowledgesNothing)
{
    auto const sleeper = obdsim::simulateCar({});
    sleeper->control("ignition off");
    Conversation host(sleeper);
    EXPECT_EQ(host.ask({"ATE0", "ATSP6", "0100"}), "CAN ERROR\r\r>");
    EXPECT_EQ(host.ask({"ATSP7", "0100"}), "CAN ERROR\r\r>") << "at the right rate, too";
    EXPECT_EQ(host.ask({"ATSP1", "0100"}), "NO DATA\r\r>");
}

TEST(BusStart, quietIsCountedFromTheLastReply)
{
    for (auto const& [rest, told] : {std::pair{1, "02"}, {0, "03"}}) {
        auto host = withVehicle(car(6), "elm327-v2.3");
        host.ask({"ATE0", "ATSP6", "010D"});
        host.pass(3 * microseconds(655360) - Ms(1) - microseconds(rest)); // the conversation has passed one already
        EXPECT_EQ(host.ask("ATAMC"), std::string(told) + "\r\r>");
    }
}

} // namespace
