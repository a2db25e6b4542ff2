// What changes a car while it runs: control lines, scenarios, and the public face that has both.
#include "simulator/control/scenario.h"
#include "simulator/serve/controlsocket.h"
#include "simulator/simulatedcar.h"
#include "tests/simulator/conversation.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>
#include <obdsim/sim.h>

#include <cstdio>
#include <fstream>
#include <set>

namespace {

using obdsim::ControlError;
using obdsim::Ms;
using velmora::sim::Options;
using velmora::sim::Simulator;

std::string joined(std::initializer_list<char const*> lines, Simulator& car)
{
    std::string reply;
    for (char const* line : lines) {
        reply = car.ask(line);
    }
    return reply;
}

/// A car on whose bus the host is.
Simulator awake(Options const& options = {})
{
    Simulator car(options);
    joined({"ATE0", "ATS0", "ATSP0", "0100"}, car);
    return car;
}

TEST(Control, ignitionIsAStateThatSilencesTheCar)
{
    Simulator car = awake();
    EXPECT_EQ(car.ask("ATIGN"), "ON\r\r>");
    car.control("ignition off");
    EXPECT_EQ(car.ask("010C1"), "CAN ERROR\r\r>");
    EXPECT_EQ(car.ask("ATIGN"), "OFF\r\r>");
    EXPECT_EQ(car.ask("ATRV"), "12.4V\r\r>");
    EXPECT_EQ(joined({"ATPC", "0100"}, car), "SEARCHING...\rUNABLE TO CONNECT\r\r>");
    car.control("ignition on");
    EXPECT_EQ(car.ask("0100").substr(0, 17), "SEARCHING...\r4100");
    EXPECT_EQ(car.ask("010C1").substr(0, 8), "410C0000") << "the engine is not started by that";
    Options kLine;
    kLine.vehicle = "petrol-kwp-fast";
    Simulator old = awake(kLine);
    old.control("ignition off");
    EXPECT_EQ(old.ask("010C"), "NO DATA\r\r>");
    EXPECT_EQ(joined({"ATSP5", "0100"}, old), "BUS INIT: ERROR\r\r>");
}

TEST(Control, engineStopsAndBeginsAnewWithWhatItHasReached)
{
    Simulator car = awake();
    car.control("module 7E9 silent");
    car.advance(std::chrono::seconds(60));
    std::string const odometer = car.ask("01A61");
    car.control("engine stop");
    EXPECT_EQ(car.ask("010C1").substr(0, 8), "410C0000");
    EXPECT_EQ(car.ask("010D1").substr(0, 6), "410D00");
    EXPECT_EQ(car.ask("ATRV"), "12.4V\r\r>");
    EXPECT_EQ(car.ask("010B1").substr(0, 6), "410B64") << "the manifold has the pressure of the air";
    EXPECT_EQ(car.ask("01041").substr(0, 6), "410400");
    car.advance(std::chrono::seconds(600));
    EXPECT_EQ(car.ask("01A61"), odometer);
    car.control("engine start");
    EXPECT_EQ(car.ask("011F1").substr(0, 8), "411F0000") << "seconds since the start";
    EXPECT_NE(car.ask("010C1").substr(0, 8), "410C0000");
    car.advance(std::chrono::seconds(60));
    EXPECT_GT(car.ask("01A61"), odometer);
    car.control("ignition off");
    EXPECT_THROW(car.control("engine start"), velmora::sim::Error);
}

TEST(Control, codesValuesAndVoltageAreSet)
{
    Simulator car = awake({.vehicle = "petrol-can29-250", .adapter = "elm327-v1.5", .faults = {}, .scenario = {}});
    EXPECT_EQ(car.ask("03"), "4300\r\r>");
    car.control("set P0420");
    car.control("set U0100 pending 18DAF110");
    car.control("set P0420 permanent");
    EXPECT_EQ(car.ask("03"), "43010420\r\r>");
    EXPECT_EQ(car.ask("07"), "4701C100\r\r>");
    EXPECT_EQ(car.ask("0A"), "4A010420\r\r>");
    EXPECT_EQ(car.ask("0101").substr(0, 6), "410181") << "one code, lamp on";
    car.control("clear");
    EXPECT_EQ(car.ask("03"), "4300\r\r>");
    EXPECT_EQ(car.ask("0A"), "4A010420\r\r>") << "permanent codes stay";
    car.control("value 18DAF110 0C 30 00");
    EXPECT_EQ(car.ask("010C"), "410C3000\r\r>");
    car.control("value 18DAF110 A6 00000001");
    EXPECT_EQ(car.ask("01A6"), "41A600000001\r\r>");
    car.control("value 18DAF110 0C drive");
    EXPECT_NE(car.ask("010C"), "410C3000\r\r>");
    car.control("hold speed 90");
    EXPECT_EQ(car.ask("010D"), "410D5A\r\r>");
    car.control("hold speed free");
    EXPECT_NE(car.ask("010D"), "410D5A\r\r>");
    car.control("voltage 11.8");
    EXPECT_EQ(car.ask("ATRV"), "11.8V\r\r>");
    car.control("voltage drive");
    EXPECT_NE(car.ask("ATRV"), "11.8V\r\r>");
}

TEST(Control, faultsLossAndSilence)
{
    Simulator car = awake();
    EXPECT_EQ(car.ask("010D").substr(0, 4), "410D");
    car.control("fault prompt@next");
    EXPECT_EQ(car.ask("ATI"), "ELM327 v1.5\r\r");
    EXPECT_EQ(car.ask("ATI"), "ELM327 v1.5\r\r>");
    car.control("fault error:BUS BUSY@2");
    EXPECT_EQ(car.ask("ATI"), "ELM327 v1.5\r\r>");
    EXPECT_EQ(car.ask("ATI"), "BUS BUSY\r\r>");
    car.control("fault cut@4");
    EXPECT_EQ(car.ask("ATI"), "ELM");
    car.control("fault prompt=1");
    EXPECT_EQ(car.ask("ATI"), "ELM327 v1.5\r\r");
    car.control("fault none");
    EXPECT_EQ(car.ask("ATI"), "ELM327 v1.5\r\r>");
    EXPECT_EQ(car.ask("0100").size(), 2 * 13U + 2) << "two modules";
    car.control("module 7E9 silent");
    EXPECT_EQ(car.ask("0100").size(), 13U + 2);
    car.control("module 7E9 speaks");
    EXPECT_EQ(car.ask("0100").size(), 2 * 13U + 2);
    car.control("loss");
    EXPECT_FALSE(car.linkIsUp());
    EXPECT_EQ(car.ask("ATI"), "");
}

TEST(Control, requestsAreCounted)
{
    Simulator car = awake();
    car.ask("01 0c");
    car.ask("");
    EXPECT_EQ(car.count("010C"), 2U) << "an empty line repeats the last";
    EXPECT_EQ(car.count("010D"), 0U);
    ASSERT_EQ(car.requests().size(), 6U);
    EXPECT_EQ(car.requests()[4].text, "010C");
    EXPECT_GT(car.requests()[5].time, car.requests()[4].time);
    std::string const told = car.control("requests");
    EXPECT_EQ(told.substr(0, 9), "6 in all\n");
    EXPECT_NE(told.find("2 010C\n"), std::string::npos) << told;
}

struct MistakeCase
{
    char const* line;
    char const* told;
};

TEST(Control, mistakesNameTheWordAndWhatBelongsThere)
{
    MistakeCase const cases[] = {
        {"fly", "word 1 is \"fly\"; here belongs a command; help lists them"},
        {"ignition", "word 2 is missing; here belongs on or off"},
        {"ignition maybe", "word 2 is \"maybe\"; here belongs on or off"},
        {"ignition on|off", "word 2 is \"on|off\"; here belongs on or off"},
        {"clear all", "word 2 is \"all\"; here belongs the end of the line"},
        {"set P9", "word 2 is \"P9\"; here belongs a trouble code such as P0420"},
        {"set P0420 soon", "word 3 is \"soon\"; here belongs stored or pending or permanent"},
        {"module 7EA silent", "word 2 is \"7EA\"; here belongs a module: 7E8, 7E9"},
        {"value 7E8 0G 30", "word 3 is \"0G\"; here belongs a PID of two hexadecimal digits"},
        {"value 7E8 0C", "word 4 is missing; here belongs BYTES..."},
        {"value 7E8 0C 300", "word 4 is \"300\"; here belongs data bytes in hexadecimal digits, or drive"},
        {"hold speed fast", "word 3 is \"fast\"; here belongs a number, or free"},
        {"hold speed inf", "word 3 is \"inf\"; here belongs a number, or free"},
        {"voltage 100", "word 2 is \"100\"; here belongs a number of volts from 0 to 99"},
        {"voltage 99.1", "word 2 is \"99.1\"; here belongs a number of volts from 0 to 99"},
        {"voltage -0.1", "word 2 is \"-0.1\"; here belongs a number of volts from 0 to 99"},
        {"voltage", "word 2 is missing; here belongs NUMBER"},
        {"value 7E8 0C0D 30", "word 3 is \"0C0D\"; here belongs a PID of two hexadecimal digits"},
        {"value 7F0 0C 30", "word 2 is \"7F0\"; here belongs a module: 7E8, 7E9"},
        {"value 7G8 0C 30", "word 2 is \"7G8\"; here belongs a module: 7E8, 7E9"},
        {"set P0420 stored 7E8 9", "word 5 is \"9\"; here belongs the end of the line"},
        {"module 7E8 speak", "word 3 is \"speak\"; here belongs silent or speaks"},
        {"hold speed", "word 3 is missing; here belongs NUMBER"},
    };
    auto const car = obdsim::simulateCar({});
    for (auto const& row : cases) {
        try {
            car->control(row.line);
            ADD_FAILURE() << row.line;
        } catch (ControlError const& error) {
            EXPECT_STREQ(error.what(), row.told);
        }
    }
    EXPECT_THROW(car->control("hold colour 3"), ControlError);
    EXPECT_THROW(car->control("fault fire@3"), ControlError);
    EXPECT_TRUE(car->typed().empty());
    auto const handler = [&](std::string const& line) { return car->control(line); };
    EXPECT_EQ(obdsim::controlReply(handler, "clear", 1), "ok\n");
    EXPECT_EQ(obdsim::controlReply(handler, "clear all", 7),
              "error: line 7, word 2 is \"all\"; here belongs the end of the line\n");
}

TEST(Control, helpTellsEveryFormAndSoDoesTheGuide)
{
    std::string const help = obdsim::simulateCar({})->control("help");
    std::ifstream file(VELMORA_SOURCE_DIR "/docs/simulator.md");
    std::string const guide((std::istreambuf_iterator<char>(file)), std::istreambuf_iterator<char>());
    for (auto const& each : obdsim::Control::forms()) {
        EXPECT_NE(help.find(std::string(each.form) + " "), std::string::npos) << each.form;
        EXPECT_NE(guide.find("\n" + std::string(each.form) + "\n"), std::string::npos) << each.form;
    }
}

TEST(Control, carIsReachedWhileItIsServed)
{
    Simulator car;
    EXPECT_EQ(car.serveTcp().substr(0, 10), "127.0.0.1:");
    car.control("voltage 11.8");
    EXPECT_THROW(car.control("voltage much"), velmora::sim::Error);
    EXPECT_EQ(car.ask("ATRV"), "ATRV\r11.8V\r\r>");
    EXPECT_EQ(car.count("ATRV"), 1U);
    car.stop();
    velmora::sim::Time const stopped = car.now();
    for (int i = 0; i < 10; ++i) {
        EXPECT_EQ(car.now(), stopped) << "the clock of a car that nobody serves stands";
    }
    EXPECT_EQ(car.servePseudoTerminal().substr(0, 5), "/dev/");
    EXPECT_EQ(car.scenario().find("voltage 11.8"), car.scenario().find("voltage"));
}

TEST(Scenario, linesAreReadAndMistakesNameTheirPlace)
{
    auto const lines = obdsim::parseScenario("# a drive\n0.5 ignition off\n\n 2\tvoltage 11.8 \n", "x");
    ASSERT_EQ(lines.size(), 2U);
    EXPECT_EQ(obdsim::parseScenario("0 clear\n10000000 clear\n10000000 clear\n", "x").size(), 3U) << "together";
    EXPECT_EQ(obdsim::parseScenario("1.0000004 clear\n1.0000006 \t clear\n", "x")[1].time, obdsim::Time(1000001))
        << "to the nearest microsecond";
    EXPECT_EQ(obdsim::parseScenario(" 1.5  hold speed 3\r\n", "x")[0].command, " hold speed 3\r");
    EXPECT_EQ(lines[1].time, Ms(2000));
    EXPECT_EQ(obdsim::formatScenario(lines), "0.500000 ignition off\n2.000000 voltage 11.8 \n");
    MistakeCase const cases[] = {
        {"soon clear", "x:1: word 1 is \"soon\"; here belongs the seconds since the beginning"},
        {"10000000.1 clear", "x:1: word 1 is \"10000000.1\"; here belongs the seconds since the beginning"},
        {"-1 clear", "x:1: word 1 is \"-1\"; here belongs the seconds since the beginning"},
        {"5 clear\n4 clear", "x:2: word 1 is \"4\"; here belongs a time that is not before that of the line above"},
        {"5", "x:1: word 2 is missing; here belongs a control command"},
        {"5 ignition up", "x:1: word 2 is \"up\"; here belongs on or off"},
    };
    for (auto const& row : cases) {
        try {
            obdsim::parseScenario(row.line, "x");
            ADD_FAILURE() << row.line;
        } catch (ControlError const& error) {
            EXPECT_STREQ(error.what(), row.told);
        }
    }
}

/// A file in the folder of the tests, removed at the end.
class ScenarioFile
{
public:
    explicit ScenarioFile(std::string const& text) : m_path(testsupport::ownPath("control_test.scenario"))
    {
        std::ofstream(m_path) << text;
    }
    ~ScenarioFile() { std::remove(m_path.c_str()); }
    std::string const& path() const { return m_path; }

private:
    std::string m_path;
};

/// All that a host gets within 20 seconds that asks each half second.
std::string runOf(Simulator& car, bool typing)
{
    std::string said;
    for (int i = 0; i < 40; ++i) {
        if (typing && i == 10) {
            car.control("ignition off");
        }
        if (typing && i == 20) {
            car.control("ignition on");
            car.control("value 7E8 0D 21");
            car.control("fault garbage=0.1");
        }
        car.send(i == 0 ? "ATSP6\r" : "010D\r");
        said += car.advance(std::chrono::milliseconds(500)) + "|";
    }
    return said;
}

TEST(Scenario, whatWasTypedRunsAgainBitForBit)
{
    Simulator typed;
    std::string const first = runOf(typed, true);
    EXPECT_NE(first.find("CAN ERROR"), std::string::npos);
    EXPECT_NE(first.find("41 0D 21"), std::string::npos);
    ScenarioFile const file(typed.scenario());
    Options options;
    options.scenario = file.path();
    Simulator again(options);
    EXPECT_EQ(runOf(again, false), first);
    ScenarioFile const wrong("1 module 999 silent\n");
    try {
        Simulator const never(
            Options{.vehicle = "petrol-can11", .adapter = "elm327-v1.5", .faults = {}, .scenario = wrong.path()});
        ADD_FAILURE();
    } catch (velmora::sim::Error const& error) {
        EXPECT_EQ(std::string(error.what()), wrong.path() + ":1: word 2 is \"999\"; here belongs a module: 7E8, 7E9");
    }
}

/// Each control line that changes something, and what a host gets meanwhile.
TEST(Scenario, everyControlLineRepeatsBitForBit)
{
    std::vector<std::string> const lines = {
        "set P0420 pending",  "hold speed 90", "voltage 11.8",      "value 7E8 0C 3000", "engine stop", "engine start",
        "ignition off",       "ignition on",   "module 7E9 silent", "fault prompt@next", "clear",       "fault none",
        "fault garbage=0.05", "loss"};
    std::set<std::string> untried;
    for (auto const& form : obdsim::Control::forms()) {
        untried.insert(obdsim::controlWords(form.form)[0]);
    }
    auto const run = [&](Simulator& car, bool typing) {
        std::string said;
        for (std::size_t i = 0; i < lines.size(); ++i) {
            if (typing) {
                car.control(lines[i]);
                untried.erase(obdsim::controlWords(lines[i])[0]);
            }
            for (char const* const request : {"ATSP6", "010C1", "010D1", "07", "03", "ATRV"}) {
                car.send(std::string(request) + "\r");
                said += car.advance(std::chrono::milliseconds(700)) + "|";
            }
        }
        return said + (car.linkIsUp() ? "up" : "lost");
    };
    Simulator typed({.vehicle = "petrol-can11", .adapter = "elm327-v1.5", .faults = {"seed=3"}});
    std::string const first = run(typed, true);
    EXPECT_EQ(untried, (std::set<std::string>{"help", "requests"})) << "these change nothing";
    for (char const* part : {"47 02 03 00 04 20", "41 0D 5A", "11.8V", "41 0C 30 00", "CAN ERROR", "lost"}) {
        EXPECT_NE(first.find(part), std::string::npos) << part;
    }
    ScenarioFile const file(typed.scenario());
    for (int i = 0; i < 2; ++i) {
        Simulator again(Options{
            .vehicle = "petrol-can11", .adapter = "elm327-v1.5", .faults = {"seed=3"}, .scenario = file.path()});
        EXPECT_EQ(run(again, false), first);
    }
}

TEST(Vehicle, withoutModulesIsACarWhoseBusIsDead)
{
    auto host = withVehicle("name = \"Nobody\"\nprotocol = 6\n");
    EXPECT_EQ(host.ask({"ATE0", "0100"}), "SEARCHING...\rUNABLE TO CONNECT\r\r>");
    EXPECT_EQ(host.ask({"ATSP6", "0100"}), "CAN ERROR\r\r>");
}

} // namespace
