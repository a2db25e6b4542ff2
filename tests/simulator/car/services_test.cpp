#include "simulator/car/services.h"
#include "simulator/car/vehicle.h"
#include "simulator/car/vehiclefile.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Bytes;
using obdsim::Ms;
using obdsim::Time;
using obdsim::Vehicle;

constexpr char const* moduleText = R"(
lamp = true
stored = ["P0100", "P0200", "P0300", "C0300"]
pending = []
permanent = ["P0100"]
live = "0C 0D 42"
fixed = { "1C" = "06", "05" = "7B" }
[module.monitors]
supported = ["misfire", "fuel-system", "components", "catalyst", "evaporative-system"]
incomplete = ["evaporative-system"]
this_cycle = ["misfire", "catalyst"]
this_cycle_incomplete = ["catalyst"]
[[module.frames]]
number = 0
code = "P0100"
pids = "05 0D"
values = { "0C" = "1A F8" }
[module.info]
vin = "WDX-SIM0019212345"
calibrations = ["05E019EB4180BEAJ", "SHORT"]
verifications = ["AD343D35", "A9C9EF55"]
ecu_name = "ECM-EngineControl"
spark_counters = [831, 3233, 913, 831]
[[module.routines]]
id = "01"
)";

constexpr char const* canTests = R"(
[[module.routines]]
id = "02"
refusal = "22"
[[module.monitor_tests]]
monitor = "02"
test = "05"
scaling = "10"
value = 60
minimum = 0
maximum = 600
[[module.monitor_tests]]
monitor = "02"
test = "96"
scaling = "0A"
value = 1590
minimum = 0
maximum = 1640
[[module.monitor_tests]]
monitor = "31"
test = "C0"
scaling = "82"
value = 65523
minimum = 65446
maximum = 160
)";

constexpr char const* lineTests = R"(
[[module.routines]]
id = "02"
data = "01"
[[module.sensor_tests]]
test = "01"
sensor = "01"
value = "5A"
[[module.sensor_tests]]
test = "05"
sensor = "01"
value = "14 00 28"
[[module.monitor_tests]]
test = "06"
component = "03"
value = 90
limit = 40000
[[module.monitor_tests]]
test = "06"
component = "85"
value = 90
limit = 0
)";

Vehicle canCar()
{
    return Vehicle(obdsim::parseVehicle(
        "name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\n" + std::string(moduleText) + canTests, "test"));
}

Vehicle kwpCar()
{
    return Vehicle(obdsim::parseVehicle(
        "name = \"Car\"\nprotocol = 5\n[[module]]\nid = \"10\"\n" + std::string(moduleText) + lineTests, "test"));
}

/// The payloads that answer `request`, as texts.
std::vector<std::string> ask(Vehicle& vehicle, char const* request, Time now = Time(0))
{
    std::vector<std::string> payloads;
    for (auto const& message : vehicle.request({true, 0}, *obdsim::parseHex(request), now)) {
        payloads.push_back(obdsim::hexText(message.payload, " "));
    }
    return payloads;
}

using Lines = std::vector<std::string>;

struct MaskCase
{
    std::set<std::uint8_t> ids;
    std::uint8_t base;
    char const* mask; ///< null: not answered
};

MaskCase const maskCases[] = {
    {{1, 3, 4, 5, 6, 7, 11, 12, 13, 14, 15, 16, 17, 19, 21, 28, 31, 32}, 0x00, "BE3FA813"},
    {{0x21}, 0x00, "00000001"},
    {{0x21}, 0x20, "80000000"},
    {{0x21}, 0x40, nullptr},
    {{0x20}, 0x00, "00000001"},
    {{0x20}, 0x20, nullptr},
    {{}, 0x00, "00000000"},
    {{0xFF}, 0xE0, "00000002"},
};

TEST(SupportedMask, hasABitForEachIdAndOneForTheRest)
{
    for (auto const& row : maskCases) {
        auto const mask = obdsim::supportedMask(row.ids, row.base);
        EXPECT_EQ(mask ? obdsim::hexText(*mask) : "none", row.mask == nullptr ? "none" : row.mask);
    }
}

TEST(Service01, tellsItsPidsByRange)
{
    auto car = canCar();
    EXPECT_EQ(ask(car, "01 00"), Lines{"41 00 88 18 00 11"});
    EXPECT_EQ(ask(car, "01 20"), Lines{"41 20 00 00 00 01"});
    EXPECT_EQ(ask(car, "01 40"), Lines{"41 40 C0 00 00 00"});
    EXPECT_EQ(ask(car, "01 60"), Lines{});
    EXPECT_EQ(ask(car, "01 1C"), Lines{"41 1C 06"});
    EXPECT_EQ(ask(car, "01 5C"), Lines{});
}

TEST(Service01, takesSeveralPidsOnCanAndLeavesOutTheUnknown)
{
    auto car = canCar();
    EXPECT_EQ(ask(car, "01 1C 5C 05 0D"), Lines{"41 1C 06 05 7B 0D 00"});
    auto old = kwpCar();
    EXPECT_EQ(ask(old, "01 1C"), Lines{"41 1C 06"});
    EXPECT_EQ(ask(old, "01 1C 05"), Lines{}) << "there is no rule for several PIDs before CAN";
}

TEST(Service01, monitorWordCountsCodesAndMarksWhatIsOpen)
{
    auto car = canCar();
    EXPECT_EQ(ask(car, "01 01"), Lines{"41 01 84 07 05 04"});
    EXPECT_EQ(ask(car, "01 41"), Lines{"41 41 00 01 01 01"});
}

TEST(Service02, frameHasItsCodeAndItsValues)
{
    auto car = canCar();
    EXPECT_EQ(ask(car, "02 00 00"), Lines{"42 00 00 48 18 00 00"});
    EXPECT_EQ(ask(car, "02 02 00"), Lines{"42 02 00 01 00"});
    EXPECT_EQ(ask(car, "02 0C 00"), Lines{"42 0C 00 1A F8"});
    EXPECT_EQ(ask(car, "02 05 00"), Lines{"42 05 00 7B"});
    EXPECT_EQ(ask(car, "02 42 00"), Lines{});
    EXPECT_EQ(ask(car, "02 02 01"), Lines{"42 02 01 00 00"}) << "no such frame, no code";
    EXPECT_EQ(ask(car, "02 0C 01"), Lines{});
    EXPECT_EQ(ask(car, "02 0C"), Lines{});
}

TEST(Service02, moduleThatNeverKeptAFrameTellsThatThereIsNoCode)
{
    Vehicle car(obdsim::parseVehicle("name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\nstored = []\n", "test"));
    EXPECT_EQ(ask(car, "02 00 00"), Lines{"42 00 00 40 00 00 00"});
    EXPECT_EQ(ask(car, "02 02 00"), Lines{"42 02 00 00 00"});
    EXPECT_EQ(ask(car, "02 0C 00"), Lines{});
    EXPECT_EQ(ask(car, "02 00 01"), Lines{});
}

TEST(Services03To0A, codesAreCountedOnCan)
{
    auto car = canCar();
    EXPECT_EQ(ask(car, "03"), Lines{"43 04 01 00 02 00 03 00 43 00"});
    EXPECT_EQ(ask(car, "07"), Lines{"47 00"});
    EXPECT_EQ(ask(car, "0A"), Lines{"4A 01 01 00"});
}

TEST(Services03To0A, codesComeThreeALineElsewhere)
{
    auto car = kwpCar();
    EXPECT_EQ(ask(car, "03"), (Lines{"43 01 00 02 00 03 00", "43 43 00 00 00 00 00"}));
    EXPECT_EQ(ask(car, "07"), Lines{"47 00 00 00 00 00 00"});
}

TEST(Service04, forgetsAllButThePermanentCodes)
{
    auto car = canCar();
    ask(car, "01 31");
    EXPECT_EQ(ask(car, "04", Ms(60000)), Lines{"44"});
    EXPECT_EQ(ask(car, "03"), Lines{"43 00"});
    EXPECT_EQ(ask(car, "07"), Lines{"47 00"});
    EXPECT_EQ(ask(car, "0A"), Lines{"4A 01 01 00"});
    EXPECT_EQ(ask(car, "01 01"), Lines{"41 01 00 77 05 05"}) << "lamp off, nothing complete";
    EXPECT_EQ(ask(car, "02 00 00"), Lines{"42 00 00 48 18 00 00"}) << "what a frame would hold";
    EXPECT_EQ(ask(car, "02 02 00"), Lines{"42 02 00 00 00"});
    EXPECT_EQ(ask(car, "02 0C 00"), Lines{});
    EXPECT_EQ(ask(car, "06 31"), Lines{"46 31 C0 82 00 00 00 00 00 00"});
}

TEST(Service04, isRefusedWhileTheEngineRunsIfTheFileSaysSo)
{
    Vehicle car(obdsim::parseVehicle("name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\n"
                                     "stored = [\"P0100\"]\nclears_while_running = false\n",
                                     "test"));
    EXPECT_EQ(ask(car, "04"), Lines{"7F 04 22"});
    EXPECT_EQ(ask(car, "03"), Lines{"43 01 01 00"});
}

TEST(Service05, isThereOffCanOnly)
{
    auto car = kwpCar();
    EXPECT_EQ(ask(car, "05 00 01"), Lines{"45 00 01 88 00 00 00"});
    EXPECT_EQ(ask(car, "05 01 01"), Lines{"45 01 01 5A"});
    EXPECT_EQ(ask(car, "05 05 01"), Lines{"45 05 01 14 00 28"});
    EXPECT_EQ(ask(car, "05 05 02"), Lines{});
    EXPECT_EQ(ask(car, "05 00 02"), Lines{});
    auto modern = canCar();
    EXPECT_EQ(ask(modern, "05 00 01"), Lines{});
}

TEST(Service06, hasRecordsOfNineBytesOnCan)
{
    auto car = canCar();
    EXPECT_EQ(ask(car, "06 00"), Lines{"46 00 40 00 00 01"});
    EXPECT_EQ(ask(car, "06 20"), Lines{"46 20 00 00 80 00"});
    EXPECT_EQ(ask(car, "06 02"), Lines{"46 02 05 10 00 3C 00 00 02 58 02 96 0A 06 36 00 00 06 68"});
    EXPECT_EQ(ask(car, "06 31"), Lines{"46 31 C0 82 FF F3 FF A6 00 A0"});
    EXPECT_EQ(ask(car, "06 03"), Lines{});
}

TEST(Service06, hasALineForEachComponentElsewhere)
{
    auto car = kwpCar();
    EXPECT_EQ(ask(car, "06 00"), Lines{"46 00 FF 04 00 00 00"});
    EXPECT_EQ(ask(car, "06 06"), (Lines{"46 06 03 00 5A 9C 40", "46 06 85 00 5A 00 00"}));
}

TEST(Service08, acceptsAndRefuses)
{
    auto car = canCar();
    EXPECT_EQ(ask(car, "08 00"), Lines{"48 00 C0 00 00 00"});
    EXPECT_EQ(ask(car, "08 01"), Lines{"48 01"});
    EXPECT_EQ(ask(car, "08 02"), Lines{"7F 08 22"});
    auto old = kwpCar();
    EXPECT_EQ(ask(old, "08 00 00 00 00 00 00"), Lines{"48 00 00 C0 00 00 00"});
    EXPECT_EQ(ask(old, "08 01 00 00 00 00 00"), Lines{"48 01 00 00 00 00 00"});
    EXPECT_EQ(ask(old, "08 02 00 00 00 00 00"), Lines{"48 02 01 00 00 00 00"});
}

TEST(Service09, itemsComeWholeOnCan)
{
    auto car = canCar();
    EXPECT_EQ(ask(car, "09 00"), Lines{"49 00 55 40 00 00"});
    EXPECT_EQ(ask(car, "09 02"), Lines{"49 02 01 57 44 58 2D 53 49 4D 30 30 31 39 32 31 32 33 34 35"});
    EXPECT_EQ(ask(car, "09 04"), Lines{"49 04 02 30 35 45 30 31 39 45 42 34 31 38 30 42 45 41 4A "
                                       "53 48 4F 52 54 00 00 00 00 00 00 00 00 00 00 00"});
    EXPECT_EQ(ask(car, "09 06"), Lines{"49 06 02 AD 34 3D 35 A9 C9 EF 55"});
    EXPECT_EQ(ask(car, "09 08"), Lines{"49 08 04 03 3F 0C A1 03 91 03 3F"});
    EXPECT_EQ(ask(car, "09 0A"), Lines{"49 0A 01 45 43 4D 00 2D 45 6E 67 69 6E 65 43 6F 6E 74 72 6F 6C 00 00"});
    EXPECT_EQ(ask(car, "09 0B"), Lines{});
}

TEST(Service09, itemsComeInNumberedLinesElsewhere)
{
    auto car = kwpCar();
    EXPECT_EQ(ask(car, "09 00"), Lines{"49 00 01 FF C0 00 00"});
    EXPECT_EQ(ask(car, "09 01"), Lines{"49 01 05"});
    EXPECT_EQ(ask(car, "09 02"), (Lines{"49 02 01 00 00 00 57", "49 02 02 44 58 2D 53", "49 02 03 49 4D 30 30",
                                        "49 02 04 31 39 32 31", "49 02 05 32 33 34 35"}));
    EXPECT_EQ(ask(car, "09 03"), Lines{"49 03 08"});
    EXPECT_EQ(ask(car, "09 06"), (Lines{"49 06 01 AD 34 3D 35", "49 06 02 A9 C9 EF 55"}));
    EXPECT_EQ(ask(car, "09 08"), (Lines{"49 08 01 03 3F 0C A1", "49 08 02 03 91 03 3F"}));
}

TEST(Module, staysSilentOrRefusesWhatItDoesNotKnow)
{
    auto silent = canCar();
    EXPECT_EQ(ask(silent, "22 11 4F"), Lines{});
    Vehicle refusing(obdsim::parseVehicle("name = \"Car\"\nprotocol = 5\n[[module]]\nid = \"10\"\nrefuses = true\n"
                                          "live = \"0C\"\n",
                                          "test"));
    EXPECT_EQ(ask(refusing, "01 10"), Lines{"7F 01 12"});
    EXPECT_EQ(ask(refusing, "22 11 4F"), Lines{"7F 22 11"});
    EXPECT_EQ(ask(refusing, "03"), Lines{"7F 03 11"});
}

TEST(Module, recordedAnswersComeFirstAndFillTheRanges)
{
    Vehicle car(obdsim::parseVehicle("name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\n[module.raw]\n"
                                     "\"0140\" = \"41 40 CC D2 00 00\"\n\"0904\" = \"49 04 01\"\n",
                                     "test"));
    EXPECT_EQ(ask(car, "01 40"), Lines{"41 40 CC D2 00 00"});
    EXPECT_EQ(ask(car, "01 20"), Lines{"41 20 00 00 00 01"});
    EXPECT_EQ(ask(car, "09 00"), Lines{"49 00 10 00 00 00"});
    EXPECT_EQ(ask(car, "06 00"), Lines{});
}

TEST(Vehicle, answersInTheOrderOfTheModulesLatencies)
{
    Vehicle car(obdsim::parseVehicle("name = \"Car\"\nprotocol = 6\n"
                                     "[[module]]\nid = \"7E8\"\nlatency = 30\nraw = { \"0100\" = \"41 00\" }\n"
                                     "[[module]]\nid = \"7E9\"\nlatency = 20\nraw = { \"0100\" = \"41 01\" }\n",
                                     "test"));
    EXPECT_EQ(ask(car, "01 00"), (Lines{"41 01", "41 00"}));
    EXPECT_EQ(car.request({false, 0x7E8}, {0x01, 0x00}, Time(0)).size(), 1U);
    EXPECT_EQ(car.request({false, 0x7EA}, {0x01, 0x00}, Time(0)).size(), 0U);
    EXPECT_EQ(car.request({true, 0}, {}, Time(0)).size(), 0U);
}

} // namespace
