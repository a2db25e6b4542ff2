#include "simulator/car/monitornames.h"
#include "simulator/car/vehiclefile.h"
#include "simulator/car/vehiclelibrary.h"

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

const std::string head = "name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\n";

struct ErrorCase
{
    std::string text;
    std::string error;
};

TEST(VehicleFile, errorsNameFileAndLine)
{
    const ErrorCase cases[] = {
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
        {"name = \"Car\"\nprotocol = 6\n[engine]\nfuel = \"coal\"\n",
         "car.toml:4: \"fuel\" must be \"petrol\" or \"diesel\""},
    };
    for (auto const& row : cases) {
        EXPECT_EQ(errorOf(row.text).substr(0, row.error.size()), row.error) << row.text;
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
    const std::string path = testing::TempDir() + "obdsim-vehicle.toml";
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
