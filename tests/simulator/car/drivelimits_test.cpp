// The drive at the ends of its ranges, and what an engine that stands, starts and is cleared leaves behind.
#include "simulator/car/drive.h"
#include "simulator/car/livepids.h"
#include "simulator/simulatedcar.h"
#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Bytes;
using obdsim::DriveModel;
using obdsim::DriveState;
using obdsim::EngineData;
using obdsim::Ms;
using obdsim::Time;

/// The state of a warm engine at a steady speed.
DriveState steadyAt(double kmh, EngineData engine = {})
{
    std::string const speed = std::to_string(kmh);
    engine.course = std::make_shared<obdsim::Course const>(
        obdsim::parseDrive("seconds,speed\n0," + speed + "\n100," + speed + "\n", "x").course);
    return DriveModel(engine).at(Time(0));
}

TEST(DriveLimits, eachGearReachesUpToItsSpeed)
{
    EngineData warm;
    warm.startCoolantCelsius = 91;
    for (auto const& [kmh, ratio] : {std::pair{18.0, 118.0},
                                     {18.25, 68.0},
                                     {36.0, 68.0},
                                     {36.25, 46.0},
                                     {56.0, 46.0},
                                     {56.25, 35.0},
                                     {76.0, 35.0},
                                     {76.25, 28.5},
                                     {400.0, 28.5},
                                     {500.0, 28.5}}) {
        EXPECT_NEAR(steadyAt(kmh, warm).rpm, kmh * ratio, 1e-9) << kmh;
    }
    EXPECT_NEAR(steadyAt(5, warm).rpm, 780, 1e-9) << "it idles";
    EXPECT_NEAR(steadyAt(0).rpm, 780, 1e-9) << "and no faster at 62 degrees";
}

TEST(DriveLimits, whatBeginsWithALoadOrSpeedBeginsBehindIt)
{
    EXPECT_EQ(steadyAt(6.25).loadPercent, 25);
    EXPECT_EQ(steadyAt(6.25).pedalPercent, 0);
    EXPECT_GT(steadyAt(6.5).pedalPercent, 2.7);
    EXPECT_EQ(steadyAt(20).purgePercent, 0);
    EXPECT_EQ(steadyAt(20.25).purgePercent, 12);
    EngineData turbo;
    turbo.boosted = true;
    EXPECT_EQ(steadyAt(287.5, turbo).loadPercent, 70);
    EXPECT_NEAR(steadyAt(287.5, turbo).manifoldKpa, 24 + 70 * 0.78, 1e-9);
    EXPECT_NEAR(steadyAt(300, turbo).manifoldKpa, 98 + 72 * 0.9, 1e-9);
    EXPECT_NEAR(steadyAt(300).manifoldKpa, 24 + 72 * 0.78, 1e-9) << "nothing blows";
    EngineData warm;
    warm.startCoolantCelsius = 50;
    EXPECT_FALSE(steadyAt(0, warm).closedLoop);
    warm.startCoolantCelsius = 50.5;
    EXPECT_TRUE(steadyAt(0, warm).closedLoop);
}

TEST(DriveLimits, pidsAreExactWhereTheyAreLarge)
{
    DriveState state;
    state.frontSensorVolts = 1;
    state.throttlePercent = 100;
    state.coolantCelsius = 214;
    EXPECT_EQ(obdsim::livePid(0x14, state, {}), (Bytes{200, 0x80}));
    EXPECT_EQ(obdsim::livePid(0x11, state, {}), Bytes{0xFF});
    EXPECT_EQ(obdsim::livePid(0x47, state, {}), Bytes{0xFF}) << "no more than a byte holds";
    EXPECT_EQ(obdsim::livePid(0x05, state, {}), Bytes{254});
    state.throttlePercent = 60;
    EXPECT_EQ(obdsim::livePid(0x11, state, {}), Bytes{0x99});
    obdsim::SinceCleared cleared{};
    cleared.seconds = cleared.lampSeconds = 60000;
    EXPECT_EQ(obdsim::livePid(0x4D, {}, cleared), (Bytes{0x03, 0xE8}));
    EXPECT_EQ(obdsim::livePid(0x4E, {}, cleared), (Bytes{0x03, 0xE8}));
}

std::shared_ptr<obdsim::SimulatedCar> carOf(std::string const& module)
{
    auto vehicle = obdsim::parseVehicle("name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\n" + module, "x");
    return std::make_shared<obdsim::SimulatedCar>(vehicle, *obdsim::findProfile("elm327-v2.3"), obdsim::FaultPlan(),
                                                  std::vector<obdsim::ScenarioLine>());
}

Conversation quiet(std::shared_ptr<obdsim::SimulatedCar> const& car)
{
    Conversation host(car);
    host.ask({"ATE0", "ATS0", "ATSP6", "0100"});
    return host;
}

std::string data(Conversation& host, std::string const& request)
{
    std::string const reply = host.ask(request + "1");
    return reply.size() < 8 ? reply : reply.substr(4, reply.size() - 7);
}

TEST(DriveLimits, inAStandingEngineNothingFlows)
{
    auto const car = carOf("live = \"03 04 06 08 0B 0C 0D 0E 10 1F 2C 2E 42 5E 61\"\n");
    auto host = quiet(car);
    host.pass(std::chrono::seconds(30));
    car->control("engine stop");
    for (auto const& [pid, told] : {std::pair{"03", "0100"},
                                    {"04", "00"},
                                    {"06", "80"},
                                    {"08", "80"},
                                    {"0B", "64"},
                                    {"0C", "0000"},
                                    {"0D", "00"},
                                    {"0E", "80"},
                                    {"10", "0000"},
                                    {"1F", "0000"},
                                    {"2C", "00"},
                                    {"2E", "00"},
                                    {"42", "3070"},
                                    {"5E", "0000"},
                                    {"61", "7F"}}) {
        EXPECT_EQ(data(host, std::string("01") + pid), told) << pid;
    }
    EXPECT_EQ(host.ask("ATRV"), "12.4V\r\r>");
}

TEST(DriveLimits, anEngineIsStoppedAndStartedOnce)
{
    auto const car = carOf("live = \"1F 2F 31 4E A6\"\n[module.fixed]\n\"0C\" = \"0000\"\n");
    auto host = quiet(car);
    host.pass(std::chrono::seconds(600));
    std::string const seconds = data(host, "011F");
    car->control("engine start");
    EXPECT_GE(data(host, "011F"), seconds) << "it ran before";
    car->control("engine stop");
    std::string const fuel = data(host, "012F");
    std::string const minutes = data(host, "014E");
    std::string const way = data(host, "01A6");
    EXPECT_EQ(minutes, "000A");
    host.pass(std::chrono::seconds(600));
    car->control("engine stop");
    EXPECT_EQ(data(host, "01A6"), way) << "it stood before";
    car->control("engine start");
    EXPECT_EQ(data(host, "012F"), fuel) << "nobody has filled it up";
    EXPECT_EQ(data(host, "014E"), minutes);
    host.pass(std::chrono::seconds(600));
    EXPECT_EQ(data(host, "014E"), "0014");
    car->control("engine stop");
    car->control("engine start");
    host.pass(std::chrono::seconds(60));
    EXPECT_EQ(data(host, "014E"), "0015") << "all of the drives before count";
    EXPECT_EQ(data(host, "01A6").substr(0, 4), "0007") << "482 hundred tenths of a kilometre and more";
    EXPECT_LE(data(host, "012F"), fuel);
}

TEST(DriveLimits, whatIsCountedBeginsWithClearing)
{
    auto const car = carOf(
        "lamp = true\nstored = [\"P0100\"]\nwarm_ups = 9\nkilometres_since_cleared = 300\nlive = \"21 30 31 4D 4E\"\n");
    auto host = quiet(car);
    host.pass(std::chrono::seconds(1200));
    EXPECT_EQ(data(host, "0130"), "09");
    EXPECT_EQ(data(host, "0131"), "013C") << "300 and 16";
    EXPECT_EQ(data(host, "014D"), "0014");
    EXPECT_EQ(data(host, "014E"), "0014");
    EXPECT_EQ(data(host, "0121"), "0010");
    host.ask("04");
    for (auto const& [pid, told] :
         {std::pair{"30", "00"}, {"31", "0000"}, {"4D", "0000"}, {"4E", "0000"}, {"21", "0000"}}) {
        EXPECT_EQ(data(host, std::string("01") + pid), told) << pid;
    }
    host.pass(std::chrono::seconds(600));
    EXPECT_EQ(data(host, "0131"), "0008");
    EXPECT_EQ(data(host, "014E"), "000A");
    EXPECT_EQ(data(host, "0130"), "00");
    car->control("set P0200 stored");
    EXPECT_EQ(data(host, "014D"), "001E") << "a lamp is on as long as the drive";
}

TEST(DriveLimits, codesThatAreSetByHandAreSetOnce)
{
    auto const car = carOf("live = \"0C\"\n[module.monitors]\nsupported = [\"misfire\"]\n");
    auto host = quiet(car);
    EXPECT_EQ(host.ask("071"), "NO DATA\r\r>") << "the service is not there";
    car->control("set P0100 pending");
    car->control("set P0100 pending");
    car->control("set P0200 permanent");
    EXPECT_EQ(host.ask("071"), "47010100\r\r>");
    EXPECT_EQ(host.ask("0A1"), "4A010200\r\r>");
    EXPECT_EQ(host.ask("031"), "NO DATA\r\r>");
    EXPECT_EQ(data(host, "0101"), "00010000") << "no lamp for these";
    car->control("set P0300");
    car->control("set P0300 stored 7E8");
    EXPECT_EQ(host.ask("031"), "43010300\r\r>");
    EXPECT_EQ(data(host, "0101"), "81010000");
    car->control("value 7E8 3C 1000");
    EXPECT_EQ(data(host, "0120"), "00000011") << "what was set by hand is offered";
    EXPECT_EQ(data(host, "013C"), "1000");
}

TEST(DriveLimits, clearingMayNeedAnEngineThatStands)
{
    auto const car = carOf("stored = [\"P0100\"]\nclears_while_running = false\n");
    auto host = quiet(car);
    EXPECT_EQ(host.ask("041"), "7F0422\r\r>");
    car->control("hold rpm 1");
    EXPECT_EQ(host.ask("041"), "7F0422\r\r>");
    car->control("hold rpm free");
    car->control("engine stop");
    EXPECT_EQ(host.ask("041"), "44\r\r>");
}

TEST(DriveLimits, monitorsOfADieselTellItsIgnition)
{
    obdsim::Vehicle diesel(obdsim::parseVehicle(
        "name = \"Car\"\nprotocol = 6\n[engine]\nfuel = \"diesel\"\n[[module]]\nid = \"7E8\"\nstored = []\n"
        "[module.monitors]\nsupported = [\"misfire\", \"pm-filter\"]\nthis_cycle = [\"misfire\"]\n",
        "x"));
    auto const ask = [&diesel](Bytes const& request) {
        return obdsim::hexText(diesel.request({true, 0}, request, Time(0)).at(0).payload);
    };
    EXPECT_EQ(ask({0x01, 0x01}), "410100094000");
    EXPECT_EQ(ask({0x01, 0x41}), "414100090000");
    ask({0x04});
    EXPECT_EQ(ask({0x01, 0x01}), "410100194040") << "the ignition is no monitor that could be open";
    EXPECT_EQ(ask({0x01, 0x41}), "414100190000");
}

} // namespace
