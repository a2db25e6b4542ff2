// Services asked with too little, too much, and at their ends.
#include "simulator/adapter/profile.h"
#include "simulator/car/services.h"
#include "simulator/car/vehicle.h"
#include "simulator/car/vehiclefile.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Bytes;
using obdsim::Time;
using obdsim::Vehicle;

using Lines = std::vector<std::string>;

/// A car on a bus with one module, and what it says.
class Car
{
public:
    Car(int protocol, std::string const& module)
        : m_vehicle(obdsim::parseVehicle("name = \"Car\"\nprotocol = " + std::to_string(protocol) +
                                             "\n[[module]]\nid = \"" + (protocol == 6 ? "7E8" : "10") + "\"\n" + module,
                                         "x"))
    {}

    Lines ask(std::string const& request, bool everyone = true)
    {
        Lines all;
        for (auto const& message : m_vehicle.request({everyone, 0x7E8}, *obdsim::parseHex(request), Time(0))) {
            all.push_back(obdsim::hexText(message.payload));
        }
        return all;
    }

private:
    Vehicle m_vehicle;
};

TEST(ServiceLimits, whatIsAskedWithTooLittle)
{
    Car can(6, "live = \"0C\"\nstored = [\"P0100\"]\nuds = true\nuds_codes = [{ code = \"P0100\", type = \"1C\", "
               "status = \"01\" }]\n"
               "kwp_codes = [{ code = \"P0200\", status = \"60\" }]\n[module.info]\nvin = "
               "\"V\"\n[[module.routines]]\nid = \"01\"\n"
               "[[module.monitor_tests]]\nmonitor = \"01\"\ntest = \"81\"\nscaling = \"10\"\nvalue = 1\nminimum = "
               "0\nmaximum = 3\n");
    for (auto const& [request, reply] : {std::pair{"01", ""},
                                         {"02", ""},
                                         {"020C", ""},
                                         {"06", ""},
                                         {"08", ""},
                                         {"09", ""},
                                         {"22", "7F2213"},
                                         {"22F1", "7F2213"},
                                         {"22F190F1", "7F2213"},
                                         {"19", "7F1912"},
                                         {"1902", "5902FF"},
                                         {"1901", "5901FF000000"},
                                         {"190201", "5902FF01001C01"},
                                         {"190A", "590AFF01001C01"},
                                         {"190101", "5901FF000001"},
                                         {"190102", "5901FF000000"},
                                         {"190B", "7F1912"},
                                         {"18", "7F1812"},
                                         {"1800FF", "7F1812"},
                                         {"1800FF00", "5801020060"},
                                         {"1800FF0000", "7F1812"},
                                         {"1802FF00", "5801020060"},
                                         {"1803FF00", "7F1812"},
                                         {"3E", "7F3E12"},
                                         {"3E01", "7F3E12"},
                                         {"3E00", "7E00"},
                                         {"3E80", ""},
                                         {"21", ""}}) {
        Lines const told = can.ask(request, false);
        std::string const expected = reply;
        EXPECT_EQ(told, expected.empty() ? Lines{} : Lines{expected}) << request;
    }
}

TEST(ServiceLimits, ofWhatAllAreAskedOnlyRealRefusalsAreTold)
{
    Car car(6,
            "refuses = true\nuds = true\nrefusals = { \"22F190\" = \"22\", \"22F191\" = \"31\", \"0105\" = \"12\" }\n");
    EXPECT_EQ(car.ask("22F190", true), Lines{"7F2222"}) << "conditions";
    EXPECT_EQ(car.ask("22F191", true), Lines{});
    EXPECT_EQ(car.ask("22F191", false), Lines{"7F2231"});
    EXPECT_EQ(car.ask("2101", true), Lines{});
    EXPECT_EQ(car.ask("2101", false), Lines{"7F2111"});
    EXPECT_EQ(car.ask("3E01", true), Lines{});
    EXPECT_EQ(car.ask("1001", true), Lines{}) << "the first service that is hushed";
    EXPECT_EQ(car.ask("0F01", true), Lines{"7F0F11"}) << "services of OBD are not";
    EXPECT_EQ(car.ask("0105", true), Lines{"7F0112"});
    Car line(5, "refuses = true\n");
    EXPECT_EQ(line.ask("2101", true), Lines{"7F2111"}) << "a rule of CAN";
}

TEST(ServiceLimits, signalsAreScaledAndMoved)
{
    Car car(6, "[[module.signals]]\nrequest = \"2101\"\ndata = \"00 00 00 00 00 00 00 AA\"\n"
               "fields = [{ at = 0, value = \"ambient\", scale = 2, offset = 5 }, { at = 1, bytes = 2, value = "
               "\"ambient\", scale = -1 },\n"
               "          { at = 3, bytes = 4, value = \"odometer\", scale = 10 }]\n");
    EXPECT_EQ(car.ask("2101", false), Lines{"610129FFEE00075B34AA"});
    EXPECT_EQ(car.ask("210100", false), Lines{"7F2112"});
}

TEST(ServiceLimits, sensorsOfALineAreToldApart)
{
    Car car(5, "[[module.sensor_tests]]\ntest = \"01\"\nsensor = \"01\"\nvalue = \"5A\"\n[[module.sensor_tests]]\ntest "
               "= \"01\"\nsensor = \"02\"\nvalue = \"5B\"\n"
               "[[module.sensor_tests]]\ntest = \"21\"\nsensor = \"02\"\nvalue = \"5C\"\n");
    EXPECT_EQ(car.ask("050102"), Lines{"4501025B"});
    EXPECT_EQ(car.ask("050101"), Lines{"4501015A"});
    EXPECT_EQ(car.ask("050002"), Lines{"45000280000001"});
    EXPECT_EQ(car.ask("052002"), Lines{"45200280000000"});
    EXPECT_EQ(car.ask("052001"), Lines{});
    EXPECT_EQ(car.ask("050202"), Lines{});
    EXPECT_EQ(car.ask("0501"), Lines{});
    EXPECT_EQ(car.ask("05"), Lines{});
}

TEST(ServiceLimits, routinesOfALineAreNotRefused)
{
    Car car(5, "[[module.routines]]\nid = \"01\"\ndata = \"0102\"\nrefusal = \"22\"\n[[module.routines]]\nid = "
               "\"22\"\ndata = \"010203040506\"\n");
    EXPECT_EQ(car.ask("0801"), Lines{"48010102000000"});
    EXPECT_EQ(car.ask("0822"), Lines{"48220102030405"}) << "five bytes";
    EXPECT_EQ(car.ask("0820"), Lines{"48200040000000"});
    EXPECT_EQ(car.ask("0802"), Lines{});
    EXPECT_EQ(car.ask("0840"), Lines{});
}

TEST(ServiceLimits, itemsOfALineHaveTheirCounts)
{
    std::string const info = "[module.info]\nserial = \"S1\"\ncalibrations = [\"C\", \"D\"]\nverifications = "
                             "[\"AABBCCDD\"]\necu_name = \"ECM-Engine\"\n"
                             "spark_counters = [1]\ncompression_counters = [2, 3]\n";
    Car car(5, info);
    EXPECT_EQ(car.ask("0903"), Lines{"490308"});
    EXPECT_EQ(car.ask("0905"), Lines{"490501"});
    EXPECT_EQ(car.ask("0907"), Lines{"490701"});
    EXPECT_EQ(car.ask("0909"), Lines{"490905"});
    EXPECT_EQ(car.ask("090A"),
              (Lines{"490A0145434D00", "490A022D456E67", "490A03696E6500", "490A0400000000", "490A0500000000"}))
        << "the name, not how long the counters are";
    EXPECT_EQ(car.ask("0908"), Lines{"49080100010000"});
    EXPECT_EQ(car.ask("090B"), Lines{"490B0100020003"});
    EXPECT_EQ(car.ask("090C"), Lines{});
    EXPECT_EQ(car.ask("090D").size(), 5U);
    EXPECT_EQ(car.ask("0900"), Lines{"4900013FE80000"});
    Car can(6, info);
    EXPECT_EQ(can.ask("090D"), Lines{"490D010000000000000000000000000000005331"});
    EXPECT_EQ(can.ask("0903"), Lines{});
    EXPECT_EQ(can.ask("0900"), Lines{"490015680000"});
    EXPECT_EQ(can.ask("0920"), Lines{});
}

TEST(ServiceLimits, rangesOfRecordedAnswers)
{
    Car car(6, "[module.raw]\n\"020C00\" = \"42 0C 00 1A F8\"\n\"0904\" = \"49 04 01\"\n\"0924\" = \"49 24 "
               "01\"\n\"03\" = \"43 00\"\n");
    EXPECT_EQ(car.ask("0200"), Lines{}) << "by requests of two bytes alone";
    EXPECT_EQ(car.ask("0900"), Lines{"490010000001"});
    EXPECT_EQ(car.ask("0920"), Lines{"492010000000"});
    EXPECT_EQ(car.ask("0901"), Lines{});
    EXPECT_EQ(car.ask("04"), Lines{});
    Car line(5,
             "[module.raw]\n\"0602\" = \"46 02\"\n\"0802\" = \"48 02\"\n\"0902\" = \"49 02\"\n\"0102\" = \"41 02\"\n");
    EXPECT_EQ(line.ask("0600"), Lines{"4600FF40000000"});
    EXPECT_EQ(line.ask("0800"), Lines{"48000040000000"});
    EXPECT_EQ(line.ask("0900"), Lines{"49000140000000"});
    EXPECT_EQ(line.ask("0100"), Lines{"410040000000"});
}

TEST(ServiceLimits, aFileSaysOnlyWhatItsBusHas)
{
    auto const complaint = [](std::string const& text) -> std::string {
        try {
            obdsim::parseVehicle(text, "car.toml");
        } catch (obdsim::VehicleFileError const& error) {
            return error.what();
        }
        return "none";
    };
    std::string const line = "name = \"Car\"\nprotocol = 5\n[[module]]\nid = \"10\"\n";
    std::string const can = "name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\n";
    EXPECT_EQ(complaint(line + "request = \"11\"\n"), "car.toml:5: unknown key \"request\" in module");
    EXPECT_EQ(complaint(line + "address = \"11\"\n"), "car.toml:5: unknown key \"address\" in module");
    EXPECT_EQ(complaint(can + "tester = \"F1\"\n"), "car.toml:5: unknown key \"tester\" in module");
    EXPECT_EQ(complaint(can + "request = \"18DB\"\n"),
              "car.toml:5: \"request\" must have 3 hexadecimal digits on this bus");
    for (char const* const request : {"2201", "22F19001", "23F190", "2301", "1A", "1A9001", "21", "210101", ""}) {
        EXPECT_EQ(complaint(can + "[[module.signals]]\nrequest = \"" + request + "\"\n"),
                  "car.toml:6: a signal is asked by 22 and two bytes, or by 21 or 1A and one")
            << request;
    }
    for (char const* const request : {"22F190", "1A90", "2101"}) {
        EXPECT_EQ(complaint(can + "[[module.signals]]\nrequest = \"" + request + "\"\n"), "none");
    }
    EXPECT_EQ(complaint(can + "[module.info]\nverifications = [\"AABBCCDDEE\"]\n"),
              "car.toml:6: a calibration verification number is four bytes");
    EXPECT_EQ(complaint(can + "[module.raw]\n\"\" = \"49\"\n"),
              "car.toml:6: the key \"\" must be bytes in hexadecimal digits");
    EXPECT_EQ(complaint(can + "[module.fixed]\n\"1C\" = []\n"), "car.toml:6: a row is one byte and its data");
    EXPECT_EQ(complaint(can + "[module.refusals]\n\"1C\" = \"\"\n"), "car.toml:6: a refusal is one response code");
}

} // namespace
