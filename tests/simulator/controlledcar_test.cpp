// What control lines leave behind: what is counted on, forgotten, and begun anew.
#include "simulator/control/control.h"
#include "simulator/simulatedcar.h"
#include "tests/simulator/conversation.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>

namespace {

using obdsim::Ms;

std::shared_ptr<obdsim::SimulatedCar> carOf(char const* vehicle, std::vector<char const*> const& commands)
{
    auto car = obdsim::simulateCar({vehicle, "elm327-v2.3", {}});
    Conversation host(car);
    for (char const* const command : commands) {
        host.ask(std::string(command));
    }
    return car;
}

/// The number of the bytes behind the echo of a request, as in "410547".
long numberIn(std::string const& reply, std::size_t digits)
{
    return std::stol(reply.substr(4, digits), nullptr, 16);
}

TEST(ControlledCar, questionsChangeNothing)
{
    auto const car = obdsim::simulateCar({});
    std::string const help = car->control("help");
    car->control("requests");
    EXPECT_TRUE(car->typed().empty());
    car->control("clear");
    EXPECT_EQ(car->typed().size(), 1U);
    EXPECT_NE(help.find("\nclear" + std::string(41, ' ') + "all modules forget their codes, as by service 04\n"),
              std::string::npos)
        << help;
}

TEST(ControlledCar, wayAndWarmthGoOnWhenTheEngineStartsAgain)
{
    auto const car = carOf("petrol-can11", {"ATE0", "ATS0", "ATSP6", "ATSH7E0", "0100"});
    Conversation host(car);
    host.pass(std::chrono::seconds(600));
    long const way = numberIn(host.ask("01311"), 4);
    long const coolant = numberIn(host.ask("01051"), 2);
    EXPECT_GT(way, 640);
    EXPECT_GT(coolant, 85 + 40);
    car->control("engine stop");
    host.pass(std::chrono::seconds(60));
    EXPECT_EQ(numberIn(host.ask("01311"), 4), way) << "nothing turns";
    car->control("engine start");
    EXPECT_EQ(numberIn(host.ask("01311"), 4), way);
    EXPECT_LE(std::abs(numberIn(host.ask("01051"), 2) - coolant), 1) << "as warm as it was";
    host.pass(std::chrono::seconds(120));
    EXPECT_GT(numberIn(host.ask("01311"), 4), way);
}

TEST(ControlledCar, faultsOfCommandsCountFromWhereTheyAreTyped)
{
    for (auto const& [fault, second, third] :
         {std::tuple{"fault silent@2", "", ""}, std::tuple{"fault reset@2", "", "ATI\rELM327 v2.3\r\r>"},
          std::tuple{"fault error:X@2", "X\r\r>", "ELM327 v2.3\r\r>"},
          std::tuple{"fault prompt@2", "ELM327 v2.3\r\r", "ELM327 v2.3\r\r>"}}) {
        auto const car = carOf("petrol-can11", {"ATE0"});
        Conversation host(car);
        car->control("fault prompt@1"); // commands are counted from the first fault on
        EXPECT_EQ(host.ask("ATI"), "ELM327 v2.3\r\r");
        host.ask("ATI");
        car->control(fault);
        EXPECT_EQ(host.ask("ATI"), "ELM327 v2.3\r\r>") << fault;
        EXPECT_EQ(host.ask("ATI"), second) << fault;
        EXPECT_EQ(host.ask("ATI"), third) << fault;
    }
}

TEST(ControlledCar, clearingReachesAllKindsOfCodes)
{
    auto const electric = carOf("electric-can11", {"ATE0", "ATS0", "ATSP6", "0100", "ATSH7E4"});
    Conversation uds(electric);
    EXPECT_EQ(uds.ask("19018D"), "5901FF000002\r\r>");
    electric->control("clear");
    EXPECT_EQ(uds.ask("19018D"), "5901FF000000\r\r>");
    EXPECT_EQ(uds.ask("1902FF"), "5902FF\r\r>");
    auto const older = carOf("petrol-can11-modules", {"ATE0", "ATS0", "ATSP6", "0100", "ATSH7D6", "ATCRA7DE"});
    Conversation kwp(older);
    EXPECT_EQ(kwp.ask("1800FF00"), "5801415560\r\r>");
    older->control("clear");
    EXPECT_EQ(kwp.ask("1800FF00"), "5800\r\r>");
}

TEST(ControlledCar, asleepItLeavesTheAdapterAlone)
{
    auto const car = carOf("petrol-can11", {"ATE0", "ATSP6", "0100"});
    Conversation host(car);
    car->control("ignition off");
    EXPECT_EQ(host.ask("010C1"), "CAN ERROR\r\r>");
    EXPECT_EQ(host.lastWait(), Ms(4 + 150)) << "nobody acknowledges a frame";
}

TEST(ControlledCar, wakesForWhatComesFirst)
{
    std::string const path = testsupport::ownPath("controlledcar.scenario");
    std::ofstream(path) << "0.5 voltage 11.8\n2 voltage 12.1\n";
    obdsim::SimulationOptions options;
    options.scenario = path;
    auto const car = obdsim::simulateCar(options);
    EXPECT_EQ(car->nextWake(), Ms(500)) << "a line of the scenario";
    car->receive("ATZ\r");
    Conversation host(car);
    EXPECT_EQ(car->nextWake(), car->nextOutput());
    EXPECT_EQ(car->nextOutput(), obdsim::Time(0)) << "the echo";
    car->advanceTo(Ms(1));
    EXPECT_GT(car->nextOutput(), Ms(500));
    EXPECT_EQ(car->nextWake(), Ms(500)) << "before the banner";
    car->advanceTo(Ms(500));
    EXPECT_EQ(car->nextWake(), car->nextOutput()) << "before the second line";
    car->advanceTo(Ms(1000));
    EXPECT_EQ(car->nextWake(), Ms(2000));
    car->advanceTo(Ms(2000));
    EXPECT_EQ(car->nextWake(), std::nullopt);
}

} // namespace
