// What a vehicle file may say: the ends of each range, keys that nobody knows, and all of it in one file.
#include "simulator/car/services.h"
#include "simulator/car/vehicle.h"
#include "simulator/car/vehiclefile.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Bytes;
using obdsim::Ms;
using obdsim::parseVehicle;
using obdsim::VehicleFileError;

std::string const canModule = "name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\n";
std::string const lineModule = "name = \"Car\"\nprotocol = 5\n[[module]]\nid = \"10\"\n";

/// What is said of a file; "none" if nothing.
std::string complaint(std::string const& text)
{
    try {
        parseVehicle(text, "car.toml");
    } catch (VehicleFileError const& error) {
        std::string const what = error.what();
        return what.substr(what.find(": ") + 2);
    }
    return "none";
}

struct Range
{
    std::string before; ///< the value
    char const* key;
    int lowest;
    int highest;
    char const* after = "\n";
};

TEST(VehicleLimits, wholeNumbersHaveRanges)
{
    std::string const test =
        canModule + "[[module.monitor_tests]]\nmonitor = \"01\"\ntest = \"02\"\nscaling = \"03\"\n";
    std::string const oldTest = lineModule + "[[module.monitor_tests]]\ntest = \"01\"\ncomponent = \"02\"\n";
    std::string const field = canModule + "[[module.signals]]\nrequest = \"2101\"\ndata = \"00000000\"\nfields = [{ ";
    Range const ranges[] = {
        {"name = \"Car\"\n", "protocol", 1, 9},
        {"name = \"Car\"\nprotocol = 3\n", "w4", 25, 50},
        {canModule, "latency", 0, 60000},
        {canModule, "frame_gap", 0, 60000},
        {canModule, "most_pids", 1, 6},
        {canModule, "warm_ups", 0, 255},
        {canModule + "[[module.frames]]\ncode = \"P0100\"\n", "number", 0, 255},
        {test + "minimum = 0\nmaximum = 0\n", "value", 0, 65535},
        {test + "value = 0\nmaximum = 0\n", "minimum", 0, 65535},
        {test + "value = 0\nminimum = 0\n", "maximum", 0, 65535},
        {oldTest + "limit = 0\n", "value", 0, 65535},
        {oldTest + "value = 0\n", "limit", 0, 65535},
        {canModule + "[module.delays]\n\"0902\" = { ", "times", 0, 100, " }\n"},
        {canModule + "[module.delays]\n\"0902\" = { ", "milliseconds", 0, 60000, " }\n"},
        {field + "at = 0, value = \"rpm\", ", "bytes", 1, 4, " }]\n"},
    };
    for (auto const& each : ranges) {
        auto const with = [&](int value) {
            return complaint(each.before + each.key + " = " + std::to_string(value) + each.after);
        };
        std::string const wrong = "\"" + std::string(each.key) + "\" must be a whole number from " +
                                  std::to_string(each.lowest) + " to " + std::to_string(each.highest);
        EXPECT_EQ(with(each.lowest), "none") << each.key;
        EXPECT_EQ(with(each.highest), "none") << each.key;
        EXPECT_EQ(with(each.lowest - 1), wrong);
        EXPECT_EQ(with(each.highest + 1), wrong);
        EXPECT_EQ(complaint(each.before + each.key + " = 1.5" + each.after), wrong);
    }
    EXPECT_EQ(complaint(field + "at = 4096, value = \"rpm\" }]\n"), "\"at\" must be a whole number from 0 to 4095");
    EXPECT_EQ(complaint(field + "at = -1, value = \"rpm\" }]\n"), "\"at\" must be a whole number from 0 to 4095");
    EXPECT_EQ(complaint(field + "at = 4, value = \"rpm\" }]\n"), "the field ends behind the data");
    EXPECT_EQ(complaint(field + "at = 3, value = \"rpm\" }]\n"), "none");
    EXPECT_EQ(complaint(field + "at = 1, bytes = 4, value = \"rpm\" }]\n"), "the field ends behind the data");
}

TEST(VehicleLimits, keysThatNobodyKnowsAreTold)
{
    std::pair<std::string, char const*> const cases[] = {
        {"name = \"Car\"\nprotocol = 6\n[engine]\n", "engine"},
        {canModule + "[module.monitors]\n", "monitors"},
        {canModule + "[module.info]\n", "info"},
        {canModule + "[[module.frames]]\ncode = \"P0100\"\n", "frames"},
        {canModule + "[[module.monitor_tests]]\nmonitor = \"01\"\ntest = \"02\"\nscaling = \"03\"\nvalue = 0\n"
                     "minimum = 0\nmaximum = 0\n",
         "monitor_tests"},
        {canModule + "[[module.sensor_tests]]\ntest = \"01\"\nsensor = \"02\"\n", "sensor_tests"},
        {canModule + "[[module.routines]]\nid = \"01\"\n", "routines"},
        {canModule + "[module.delays]\n[module.delays.0902]\n", "0902"},
        {canModule + "[[module.signals]]\nrequest = \"2101\"\n", "signals"},
        {canModule + "[[module.uds_codes]]\ncode = \"P0100\"\ntype = \"00\"\nstatus = \"08\"\n", "uds_codes"},
        {canModule + "[[module.kwp_codes]]\ncode = \"P0100\"\nstatus = \"60\"\n", "kwp_codes"},
    };
    for (auto const& [text, title] : cases) {
        EXPECT_EQ(complaint(text), "none") << title;
        EXPECT_EQ(complaint(text + "colour = 1\n"), "unknown key \"colour\" in " + std::string(title));
    }
}

constexpr char const* everything = R"(
name = "All of it"
protocol = 6
volts = 13.5
padding = "AA"
w4 = 40
[[module]]
id = "7E8"
request = "7B3"
address = "07"
tester = "2A"
functional = false
latency = 7
frame_gap = 3
refuses = true
most_pids = 2
more_pids = "refuse"
live = "0C 0D"
fixed = { "1C" = "06" }
lamp = true
clears_while_running = false
warm_ups = 9
kilometres_since_cleared = 1.5
stored = ["P0100"]
pending = ["P0200", "P0300"]
permanent = ["C0300"]
uds = true
[module.raw]
"0904" = ["49 04 01", "49 04 02"]
[module.refusals]
"22F190" = "31"
[module.delays]
"0902" = { times = 2, milliseconds = 300 }
"0904" = {}
[[module.frames]]
number = 2
code = "P0100"
taken_at = 1.25
pids = "0C"
values = { "05" = "7B" }
[[module.frames]]
code = "P0200"
[[module.monitor_tests]]
monitor = "01"
test = "81"
scaling = "10"
value = 1
minimum = 2
maximum = 3
[[module.sensor_tests]]
test = "01"
sensor = "02"
value = "5A"
[[module.routines]]
id = "03"
data = "0102"
refusal = "22"
[[module.routines]]
id = "04"
[[module.signals]]
request = "221E1C"
text = "AB"
[[module.signals]]
request = "1A90"
data = "00 00 00"
fields = [{ at = 1, bytes = 2, value = "ambient", scale = 2, offset = 0.5 }, { at = 0, value = "ambient" }]
[[module.uds_codes]]
code = "P0133"
type = "1C"
status = "2F"
[[module.kwp_codes]]
code = "U0100"
status = "60"
[module.info]
vin = "WDX-SIM0019212345"
serial = "S1"
type_approval = "T1"
compression_counters = [7, 8]
)";

TEST(VehicleLimits, allThatAFileSaysIsRead)
{
    auto const car = parseVehicle(everything, "car.toml");
    EXPECT_EQ(car.name, "All of it");
    EXPECT_EQ(car.protocol, 6);
    EXPECT_EQ(car.volts, 13.5);
    EXPECT_EQ(car.padding, 0xAA);
    EXPECT_EQ(car.addressPause, Ms(40));
    auto const& module = car.modules.at(0);
    EXPECT_EQ(module.id, 0x7E8U);
    EXPECT_EQ(module.request, 0x7B3U);
    EXPECT_EQ(module.address, 0x07);
    EXPECT_EQ(module.tester, 0x2A);
    EXPECT_FALSE(module.functional);
    EXPECT_EQ(module.latency, Ms(7));
    EXPECT_EQ(module.frameGap, Ms(3));
    EXPECT_TRUE(module.refuses);
    EXPECT_EQ(module.mostPids, 2);
    EXPECT_EQ(module.morePids, obdsim::MorePids::Refuse);
    EXPECT_EQ(module.live, (Bytes{0x0C, 0x0D}));
    EXPECT_EQ(module.fixed, (std::map<std::uint8_t, Bytes>{{0x1C, {0x06}}}));
    EXPECT_TRUE(module.lamp);
    EXPECT_FALSE(module.clearsWhileRunning);
    EXPECT_EQ(module.warmUps, 9);
    EXPECT_EQ(module.kilometresSinceCleared, 1.5);
    EXPECT_TRUE(module.hasStored && module.hasPending && module.hasPermanent);
    EXPECT_EQ(module.stored, (std::vector<std::uint16_t>{0x0100}));
    EXPECT_EQ(module.pending, (std::vector<std::uint16_t>{0x0200, 0x0300}));
    EXPECT_EQ(module.permanent, (std::vector<std::uint16_t>{0x4300}));
    EXPECT_EQ(module.raw.at({0x09, 0x04}), (std::vector<Bytes>{{0x49, 0x04, 0x01}, {0x49, 0x04, 0x02}}));
    EXPECT_EQ(module.refusals.at({0x22, 0xF1, 0x90}), 0x31);
    EXPECT_EQ(module.delays.at({0x09, 0x02}).times, 2);
    EXPECT_EQ(module.delays.at({0x09, 0x02}).delay, Ms(300));
    EXPECT_EQ(module.delays.at({0x09, 0x04}).times, 1);
    EXPECT_EQ(module.delays.at({0x09, 0x04}).delay, Ms(100));
    EXPECT_EQ(module.routines.at(3).data, (Bytes{1, 2}));
    EXPECT_EQ(module.routines.at(3).refusal, 0x22);
    EXPECT_EQ(module.routines.at(4).refusal, 0);
    EXPECT_EQ(module.info.serial, "S1");
    EXPECT_EQ(module.info.typeApproval, "T1");
    EXPECT_EQ(module.info.vin, "WDX-SIM0019212345");
    EXPECT_EQ(module.info.compressionCounters, (std::vector<std::uint16_t>{7, 8}));
}

TEST(VehicleLimits, framesTestsCodesAndSignalsAreRead)
{
    auto const module = parseVehicle(everything, "car.toml").modules.at(0);
    ASSERT_EQ(module.frames.size(), 2U);
    EXPECT_EQ(module.frames[0].number, 2);
    EXPECT_EQ(module.frames[0].code, 0x0100);
    EXPECT_EQ(module.frames[0].takenAt, Ms(1250));
    EXPECT_EQ(module.frames[0].pids, Bytes{0x0C});
    EXPECT_EQ(module.frames[0].values.at(5), Bytes{0x7B});
    EXPECT_EQ(module.frames[1].number, 0);
    EXPECT_EQ(module.frames[1].takenAt, Ms(0));
    auto const& test = module.monitorTests.at(0);
    EXPECT_EQ(test.id, 0x01);
    EXPECT_EQ(test.test, 0x81);
    EXPECT_EQ(test.scaling, 0x10);
    EXPECT_EQ(test.words, (std::vector<std::uint16_t>{1, 2, 3}));
    EXPECT_EQ(module.sensorTests.at(0).test, 1);
    EXPECT_EQ(module.sensorTests.at(0).sensor, 2);
    EXPECT_EQ(module.sensorTests.at(0).value, Bytes{0x5A});
    EXPECT_TRUE(module.uds && module.hasKwpCodes);
    EXPECT_EQ(module.udsCodes.at(0).code, 0x0133);
    EXPECT_EQ(module.udsCodes.at(0).failureType, 0x1C);
    EXPECT_EQ(module.udsCodes.at(0).status, 0x2F);
    EXPECT_EQ(module.kwpCodes.at(0).code, 0xC100);
    EXPECT_EQ(module.kwpCodes.at(0).status, 0x60);
    EXPECT_EQ(module.signals.at({0x22, 0x1E, 0x1C}).data, (Bytes{'A', 'B'}));
    auto const& fields = module.signals.at({0x1A, 0x90}).fields;
    ASSERT_EQ(fields.size(), 2U);
    EXPECT_EQ(fields[0].at, 1U);
    EXPECT_EQ(fields[0].bytes, 2U);
    EXPECT_EQ(fields[0].scale, 2);
    EXPECT_EQ(fields[0].offset, 0.5);
    EXPECT_EQ(fields[1].bytes, 1U);
    EXPECT_EQ(fields[1].scale, 1);
    EXPECT_EQ(fields[1].offset, 0);
    auto const plain = parseVehicle(canModule, "car.toml").modules.at(0);
    EXPECT_EQ(plain.warmUps, 12);
    EXPECT_EQ(plain.kilometresSinceCleared, 640);
    EXPECT_EQ(plain.tester, 0xF1);
    EXPECT_FALSE(plain.hasKwpCodes);
}

TEST(VehicleLimits, aRequestThatIsTooShortHasNoFurtherBytes)
{
    obdsim::Vehicle car(parseVehicle(canModule, "car.toml"));
    Bytes const request = {0x02, 0x0C};
    obdsim::ServiceCall const call{car.modules().front(), request, obdsim::Time(0)};
    EXPECT_EQ(call.at(1), 0x0C);
    EXPECT_FALSE(call.at(2));
    EXPECT_FALSE(call.at(3));
}

} // namespace
