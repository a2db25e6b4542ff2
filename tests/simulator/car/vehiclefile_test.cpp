#include "simulator/car/monitornames.h"
#include "simulator/car/vehiclefile.h"
#include "simulator/car/vehiclelibrary.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <fstream>

namespace {

using obdsim::parseVehicle;
using obdsim::VehicleFileError;

std::string errorOf(std::string const& text)
{
    try {
        parseVehicle(text, "car.toml");
    } catch (VehicleFileError const& error) {
        return error.what();
    }
    return "none";
}

std::string const head = "name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\n";

struct ErrorCase
{
    std::string text;
    std::string error;
};

TEST(VehicleFile, errorsNameFileAndLine)
{
    ErrorCase const cases[] = {
        {"name = ", "car.toml:1: "},
        {"[%]\n", "car.toml:1: "},
        {"protocol = 6\n", "car.toml:1: the vehicle needs \"name\""},
        {"name = \"Car\"\nprotocol = 10\n", "car.toml:2: \"protocol\" must be a whole number from 1 to 9"},
        {"name = \"Car\"\nprotocol = \"6\"\n", "car.toml:2: \"protocol\" must be a whole number from 1 to 9"},
        {"name = 5\nprotocol = 6\n", "car.toml:1: \"name\" must be a text"},
        {"name = \"Car\"\nprotocol = 6\ncolour = 1\n[[module]]\nid = \"7E8\"\n",
         "car.toml:3: unknown key \"colour\" in the vehicle"},
        {head + "sored = []\n", "car.toml:5: unknown key \"sored\" in module"},
        {head + "live = \"0C 1C\"\n", "car.toml:5: the drive model has no PID 1C"},
        {head + "live = \"0C 1\"\n", "car.toml:5: bytes must be a text of pairs of hexadecimal digits"},
        {head + "stored = [\"P0133\", \"X0133\"]\n", "car.toml:5: \"X0133\" is no trouble code such as P0133"},
        {head + "fixed = { \"1C\" = 6 }\n", "car.toml:5: bytes must be a text of pairs of hexadecimal digits"},
        {head + "latency = -1\n", "car.toml:5: \"latency\" must be a whole number from 0 to 60000"},
        {head + "lamp = 1\n", "car.toml:5: \"lamp\" must be true or false"},
        {head + "[module.monitors]\nsupported = [\"boost-pressure\"]\n",
         "car.toml:6: \"boost-pressure\" is no monitor of this kind of engine"},
        {head + "[module.info]\nvin = \"123456789012345678\"\n", "car.toml:6: \"vin\" is longer than 17 characters"},
        {head + "[module.info]\nverifications = [\"AABB\"]\n",
         "car.toml:6: a calibration verification number is four bytes"},
        {head + "[[module.monitor_tests]]\nmonitor = \"01\"\n", "car.toml:5: monitor_tests needs \"test\""},
        {head + "[module.raw]\n\"09Z2\" = \"49\"\n",
         "car.toml:6: the key \"09Z2\" must be bytes in hexadecimal digits"},
        {head + "[module.delays]\n\"0902\" = 5\n", "car.toml:6: \"0902\" must be a table"},
        {"name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"10\"\n",
         "car.toml:4: \"id\" must have 3 hexadecimal digits on this bus"},
        {"name = \"Car\"\nprotocol = 6\nvolts = \"12\"\n", "car.toml:3: \"volts\" must be a number"},
        {"name = \"Car\"\nprotocol = 6\nw4 = 51\n", "car.toml:3: \"w4\" must be a whole number from 25 to 50"},
        {"name = \"Car\"\nprotocol = 6\npadding = \"0000\"\n",
         "car.toml:3: \"padding\" must be one byte of two hexadecimal digits"},
        {"name = \"Car\"\nprotocol = 6\nengine = 1\n", "car.toml:3: \"engine\" must be a table"},
        {"name = \"Car\"\nprotocol = 6\nmodule = 1\n", "car.toml:3: \"module\" must be an array of tables"},
        {"name = \"Car\"\nprotocol = 6\nmodule = [1]\n", "car.toml:3: \"module\" must be an array of tables"},
        {"name = \"Car\"\nprotocol = 7\n[[module]]\nid = \"7E8\"\n",
         "car.toml:4: \"id\" must have 8 hexadecimal digits on this bus"},
        {"name = \"Car\"\nprotocol = 5\n[[module]]\nid = \"7E8\"\n",
         "car.toml:4: \"id\" must have 2 hexadecimal digits on this bus"},
        {"name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7X8\"\n",
         "car.toml:4: \"id\" must have 3 hexadecimal digits on this bus"},
        {head + "stored = \"P0133\"\n", "car.toml:5: \"stored\" must be an array of texts"},
        {head + "stored = [5]\n", "car.toml:5: \"stored\" must be a text"},
        {head + "fixed = { \"1C1D\" = \"06\" }\n", "car.toml:5: a row is one byte and its data"},
        {head + "fixed = { \"1C\" = [\"06\", \"07\"] }\n", "car.toml:5: a row is one byte and its data"},
        {head + "warm_ups = 256\n", "car.toml:5: \"warm_ups\" must be a whole number from 0 to 255"},
        {head + "most_pids = 7\n", "car.toml:5: \"most_pids\" must be a whole number from 1 to 6"},
        {head + "more_pids = \"all\"\n", "car.toml:5: \"more_pids\" must be \"silence\", \"refuse\" or \"first\""},
        {head + "[module.info]\nserial = \"123456789012345678\"\n",
         "car.toml:6: \"serial\" is longer than 17 characters"},
        {head + "[module.info]\ntype_approval = \"123456789012345678\"\n",
         "car.toml:6: \"type_approval\" is longer than 17 characters"},
        {head + "[module.info]\necu_name = \"ECM-EngineControlModules\"\n",
         "car.toml:6: \"ecu_name\" is longer than 20 characters"},
        {head + "[module.info]\ncalibrations = [\"12345678901234567\"]\n",
         "car.toml:6: \"calibrations\" is longer than 16 characters"},
        {head + "[module.info]\nspark_counters = 5\n", "car.toml:6: \"spark_counters\" must be an array of numbers"},
        {head + "[module.info]\nspark_counters = [65536]\n",
         "car.toml:6: \"spark_counters\" must hold whole numbers from 0 to 65535"},
        {head + "[module.info]\nspark_counters = [-1]\n",
         "car.toml:6: \"spark_counters\" must hold whole numbers from 0 to 65535"},
        {head + "[[module.frames]]\nnumber = 256\ncode = \"P0100\"\n",
         "car.toml:6: \"number\" must be a whole number from 0 to 255"},
        {head + "[module.refusals]\n\"22F190\" = \"3131\"\n", "car.toml:6: a refusal is one response code"},
        {head + "[module.refusals]\n\"22F190\" = [\"31\", \"31\"]\n", "car.toml:6: a refusal is one response code"},
        {head + "[[module.signals]]\nrequest = \"2201\"\n",
         "car.toml:6: a signal is asked by 22 and two bytes, or by 21 or 1A and one"},
        {head + "[[module.signals]]\nrequest = \"210101\"\n", "car.toml:6: a signal is asked by 22"},
        {head + "[[module.signals]]\nrequest = \"2101\"\ndata = \"0000\"\nfields = [{ at = 1, bytes = 2, value = "
                "\"rpm\" }]\n",
         "car.toml:8: the field ends behind the data"},
        {head + "[[module.signals]]\nrequest = \"2101\"\ndata = \"00\"\nfields = [{ at = 0, value = \"colour\" }]\n",
         "car.toml:8: the drive has no \"colour\""},
        {"name = \"Car\"\nprotocol = 6\n[engine]\nfuel = \"coal\"\n",
         "car.toml:4: \"fuel\" must be \"petrol\" or \"diesel\""},
    };
    for (auto const& row : cases) {
        EXPECT_EQ(errorOf(row.text).substr(0, row.error.size()), row.error) << row.text;
    }
}

TEST(VehicleFile, limitsThemselvesAreTaken)
{
    std::string const full(17, 'A');
    auto const car = parseVehicle(
        "w4 = 25\nvolts = 12.5\npadding = \"none\"\n" + head +
            "latency = 60000\nwarm_ups = 0\nmost_pids = 6\nframe_gap = 5\nmore_pids = \"refuse\"\n[module.info]\n"
            "vin = \"" +
            full + "\"\nserial = \"" + full +
            "\"\nverifications = [\"AABBCCDD\"]\n"
            "ecu_name = \"ECM-EngineControl12\"\ncalibrations = [\"1234567890123456\"]\n"
            "spark_counters = [0, 65535]\n"
            "[[module.signals]]\nrequest = \"2101\"\ndata = \"000000\"\n"
            "fields = [{ at = 1, bytes = 2, value = \"rpm\" }]\n",
        "car.toml");
    EXPECT_EQ(car.volts, 12.5);
    EXPECT_FALSE(car.padding);
    EXPECT_EQ(car.addressPause, obdsim::Ms(25));
    ASSERT_EQ(car.modules.size(), 1U);
    auto const& module = car.modules[0];
    EXPECT_EQ(module.latency, obdsim::Ms(60000));
    EXPECT_EQ(module.frameGap, obdsim::Ms(5));
    EXPECT_EQ(module.morePids, obdsim::MorePids::Refuse);
    EXPECT_EQ(module.mostPids, 6);
    EXPECT_EQ(module.info.sparkCounters, (std::vector<std::uint16_t>{0, 65535}));
    EXPECT_EQ(module.info.ecuName, std::string("ECM\0-EngineControl12", 20)) << "the acronym fills four bytes";
    auto const& field = module.signals.begin()->second.fields.at(0);
    EXPECT_EQ(field.at, 1U);
    EXPECT_EQ(field.scale, 1);
    EXPECT_EQ(field.offset, 0);
}

TEST(VehicleFile, plainCarIsWhatMostCarsAre)
{
    auto const car = parseVehicle(head, "car.toml");
    EXPECT_EQ(car.padding, 0);
    EXPECT_FALSE(car.volts);
    auto const& module = car.modules.at(0);
    EXPECT_EQ(module.latency, obdsim::Ms(15));
    EXPECT_EQ(module.mostPids, 6);
    EXPECT_EQ(module.morePids, obdsim::MorePids::First);
    EXPECT_TRUE(module.functional);
    EXPECT_TRUE(module.clearsWhileRunning);
    EXPECT_FALSE(module.uds);
    EXPECT_FALSE(module.refuses);
    EXPECT_FALSE(module.lamp);
    EXPECT_FALSE(module.hasStored || module.hasPending || module.hasPermanent);
    auto const old = parseVehicle("name = \"Car\"\nprotocol = 5\n[[module]]\nid = \"10\"\n", "car.toml");
    EXPECT_EQ(old.modules.at(0).mostPids, 1);
    EXPECT_EQ(old.modules.at(0).morePids, obdsim::MorePids::Silence);
    auto const diesel = parseVehicle("name = \"Car\"\nprotocol = 6\n[engine]\nfuel = \"diesel\"\n", "car.toml");
    EXPECT_TRUE(diesel.engine.compression && diesel.engine.boosted);
    EXPECT_EQ(diesel.engine.topSpeedKmh, 92);
    EXPECT_EQ(diesel.engine.startFuelPercent, 63);
    EXPECT_EQ(diesel.engine.startCoolantCelsius, 62);
    EXPECT_EQ(diesel.engine.idleRpm, 780);
    EXPECT_EQ(diesel.engine.litres, 1.6);
    EXPECT_EQ(diesel.engine.ambientCelsius, 18);
}

TEST(VehicleFile, engineIsWhatTheFileSays)
{
    auto const engine =
        parseVehicle("name = \"Car\"\nprotocol = 6\n[engine]\nfuel = \"diesel\"\nboosted = false\nlitres = 2.2\n"
                     "idle_rpm = 810\nambient = -5\ncoolant_at_start = 3\nodometer = 99\nfuel_level = 40\n"
                     "top_speed = 120\n",
                     "car.toml")
            .engine;
    EXPECT_FALSE(engine.boosted);
    EXPECT_EQ(engine.litres, 2.2);
    EXPECT_EQ(engine.idleRpm, 810);
    EXPECT_EQ(engine.ambientCelsius, -5);
    EXPECT_EQ(engine.startCoolantCelsius, 3);
    EXPECT_EQ(engine.startFuelPercent, 40);
    EXPECT_EQ(engine.topSpeedKmh, 120);
    EXPECT_NEAR(obdsim::DriveModel(engine).at(obdsim::Time(0)).odometerKm, 99, 1e-9);
}

struct MonitorCase
{
    char const* name;
    int spark; ///< byte B, then C, as 16 bits; -1: this kind of engine has it not
    int compression;
};

TEST(VehicleFile, monitorsAreTheBitsOfTheStandard)
{
    MonitorCase const cases[] = {
        {"misfire", 0x0100, 0x0100},      {"fuel-system", 0x0200, 0x0200},
        {"components", 0x0400, 0x0400},   {"catalyst", 0x01, -1},
        {"heated-catalyst", 0x02, -1},    {"evaporative-system", 0x04, -1},
        {"secondary-air", 0x08, -1},      {"particulate-filter", 0x10, -1},
        {"oxygen-sensor", 0x20, -1},      {"oxygen-sensor-heater", 0x40, -1},
        {"egr-vvt", 0x80, 0x80},          {"nmhc-catalyst", -1, 0x01},
        {"nox-aftertreatment", -1, 0x02}, {"boost-pressure", -1, 0x08},
        {"exhaust-gas-sensor", -1, 0x20}, {"pm-filter", -1, 0x40},
        {"no-such-monitor", -1, -1},
    };
    for (auto const& row : cases) {
        for (bool const compression : {false, true}) {
            int const expected = compression ? row.compression : row.spark;
            obdsim::MonitorBits bits;
            EXPECT_EQ(obdsim::markMonitor(row.name, compression, false, bits), expected >= 0) << row.name;
            EXPECT_EQ(obdsim::markMonitor(row.name, compression, true, bits), expected >= 0) << row.name;
            int const present = bits.continuous << 8 | bits.once;
            EXPECT_EQ(present, std::max(expected, 0)) << row.name;
            EXPECT_EQ(bits.continuousIncomplete << 8 | bits.onceIncomplete, present) << row.name;
        }
    }
}

TEST(VehicleFile, codesAreTwoBytes)
{
    EXPECT_EQ(obdsim::parseCode("P0133"), 0x0133);
    EXPECT_EQ(obdsim::parseCode("P2463"), 0x2463);
    EXPECT_EQ(obdsim::parseCode("C0300"), 0x4300);
    EXPECT_EQ(obdsim::parseCode("B0200"), 0x8200);
    EXPECT_EQ(obdsim::parseCode("U0100"), 0xC100);
    EXPECT_EQ(obdsim::parseCode("P3FFF"), 0x3FFF);
    for (char const* text : {"", "P", "P013", "P01333", "X0133", "P4000", "P01G3", "p0133"}) {
        EXPECT_FALSE(obdsim::parseCode(text)) << text;
    }
}

TEST(VehicleLibrary, hasTheVehiclesThatAreToldAbout)
{
    auto const names = obdsim::vehicleNames();
    EXPECT_TRUE(std::is_sorted(names.begin(), names.end()));
    for (char const* name : {"petrol-can11", "diesel-can29", "petrol-iso9141", "petrol-kwp-fast", "petrol-vpw",
                             "petrol-pwm", "real-skoda", "real-hyundai-i40"}) {
        EXPECT_NE(std::find(names.begin(), names.end(), name), names.end()) << name;
    }
}

TEST(VehicleLibrary, everyVehicleLoads)
{
    for (auto const& name : obdsim::vehicleNames()) {
        auto const data = obdsim::loadVehicle(name);
        EXPECT_FALSE(data.name.empty()) << name;
        EXPECT_FALSE(data.modules.empty()) << name;
        for (auto const& module : data.modules) {
            std::string const& vin = module.info.vin;
            EXPECT_TRUE(vin.empty() || vin.size() == 17U) << name;
            EXPECT_EQ(vin.find_first_of("IOQ"), std::string::npos) << name;
        }
    }
    EXPECT_EQ(obdsim::loadVehicle("diesel-can29").modules.size(), 3U);
    EXPECT_EQ(obdsim::loadVehicle("real-skoda").modules.size(), 3U);
}

TEST(VehicleLibrary, readsAFileAndNamesAMissingOne)
{
    std::string const path = testsupport::ownPath("vehicle.toml");
    std::ofstream(path) << head;
    EXPECT_EQ(obdsim::loadVehicle(path).name, "Car");
    std::remove(path.c_str());
    try {
        obdsim::loadVehicle("no-such-car");
        FAIL();
    } catch (VehicleFileError const& error) {
        EXPECT_NE(std::string(error.what())
                      .find("no-such-car: no vehicle of that name, and no vehicle file, for there is no such file"),
                  std::string::npos);
        EXPECT_NE(std::string(error.what()).find("petrol-can11"), std::string::npos) << "tells what there is";
    }
}

} // namespace
