// The ends of what control lines take, and the names of modules in what they refuse.
#include "simulator/simulatedcar.h"
#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>
#include <obdsim/sim.h>

namespace {

using obdsim::ControlError;
using velmora::sim::Simulator;

TEST(ControlLimits, limitsThemselvesAreTaken)
{
    Simulator car;
    car.ask("ATE0");
    for (auto const& [line, told] : {std::pair{"voltage 0", "0.0V"}, {"voltage 99", "99.0V"}}) {
        car.control(line);
        EXPECT_EQ(car.ask("ATRV"), std::string(told) + "\r\r>");
    }
    auto const bytes = [](std::size_t count) {
        std::string text = "value 7E8 3C ";
        for (std::size_t i = 0; i < count; ++i) {
            text += "55";
        }
        return text;
    };
    EXPECT_EQ(car.control(bytes(250)), "");
    EXPECT_THROW(car.control(bytes(251)), velmora::sim::Error);
    try {
        car.control("ignition off");
        car.control("engine start");
        ADD_FAILURE();
    } catch (velmora::sim::Error const& error) {
        EXPECT_STREQ(error.what(), "word 2 is \"start\"; the ignition is off, say \"ignition on\" first");
    }
    EXPECT_EQ(car.scenario().find("engine start"), std::string::npos);
}

TEST(ControlLimits, modulesAreNamedByTheirIdOnTheBus)
{
    auto const complaint = [](int protocol, std::string const& id) -> std::string {
        auto const vehicle = obdsim::parseVehicle(
            "name = \"Car\"\nprotocol = " + std::to_string(protocol) + "\n[[module]]\nid = \"" + id + "\"\n", "x");
        obdsim::SimulatedCar car(vehicle, *obdsim::findProfile("elm327-v1.5"), obdsim::FaultPlan(), {});
        try {
            car.control("module 0 silent");
        } catch (ControlError const& error) {
            return error.what();
        }
        return "none";
    };
    std::string const begin = "word 2 is \"0\"; here belongs a module: ";
    EXPECT_EQ(complaint(5, "10"), begin + "10");
    EXPECT_EQ(complaint(5, "FF"), begin + "FF");
    EXPECT_EQ(complaint(6, "7E8"), begin + "7E8");
    EXPECT_EQ(complaint(6, "FFF"), begin + "FFF");
    EXPECT_EQ(complaint(7, "18DAF110"), begin + "18DAF110");
    obdsim::SimulatedCar nobody(obdsim::parseVehicle("name = \"Nobody\"\nprotocol = 6\n", "x"),
                                *obdsim::findProfile("elm327-v1.5"), obdsim::FaultPlan(), {});
    try {
        nobody.control("set P0100");
        ADD_FAILURE();
    } catch (ControlError const& error) {
        EXPECT_STREQ(error.what(), "word 4 is missing; here belongs a module, but this vehicle has none");
    }
}

TEST(ControlLimits, allThatChangesSomethingIsWrittenDown)
{
    Simulator car;
    std::string written;
    for (char const* const line :
         {"ignition off", "ignition on", "engine stop", "engine start", "set P0420 pending", "clear",
          "value 7E8 0C 3000", "hold speed 90", "voltage 11.8", "fault none", "loss", "module 7E9 silent"}) {
        car.control(line);
        written += "0.000000 " + std::string(line) + "\n";
        EXPECT_EQ(car.scenario(), written) << line;
    }
    car.control("requests");
    car.control("help");
    car.control(" # a remark");
    EXPECT_EQ(car.scenario(), written);
}

TEST(ControlLimits, clearingReachesPendingCodes)
{
    Simulator car;
    for (char const* const line : {"ATE0", "ATS0", "ATSP6", "ATSH7E0", "0100"}) {
        car.ask(line);
    }
    car.control("set P0420 pending");
    EXPECT_NE(car.ask("07").find("0420"), std::string::npos);
    EXPECT_EQ(car.ask("04"), "44\r\r>");
    EXPECT_EQ(car.ask("07"), "4700\r\r>");
}

} // namespace
