#include "libobd/parameters/monitortestresult.h"
#include "tests/libobd/parameters/diagnosticsrig.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

namespace {

using namespace obd;
using namespace diagnosticsrig;
using Texts = std::vector<std::string>;

struct ExposedMonitorTestResult : MonitorTestResult
{
    using MonitorTestResult::fromBytes;
    using MonitorTestResult::MonitorTestResult;
};

// "05: 0.060 (0.000 to 0.600) 9 status 0", a line for each result.
Texts results(ObdMonitorTestItem const& monitor, UnitSystem system)
{
    Texts lines;
    for (auto const& item : monitor.items(system)) {
        std::ostringstream line;
        line << std::hex << static_cast<int>(item->testId()) << ": " << item->value() << " (" << item->minimum()
             << " to " << item->maximum() << ") " << std::dec << item->unit() << " status " << item->status();
        lines.push_back(line.str());
    }
    return lines;
}

TEST(MonitorTestResult, AsksForItsMonitor)
{
    EXPECT_EQ(requestOf(MonitorTestResult(0x31)), (Bytes{0x06, 0x31}));
    EXPECT_EQ(MonitorTestResult(0x31).timeout(), 1500U);
}

TEST(MonitorTestResult, ACanReplyOf1ByteIsAMonitorWithoutResults)
{
    ExposedMonitorTestResult parameter(0x01);
    EXPECT_TRUE(parameter.fromBytes(canEcu, Bytes{0x46}));
    auto const monitors = parameter.getItems(*canEcu);
    ASSERT_EQ(monitors.size(), 1U);
    EXPECT_EQ(monitors[0]->id, 1U);
    EXPECT_EQ(monitors[0]->description, "Exhaust Gas Sensor Monitor Bank 1 - Sensor 1");
    EXPECT_TRUE(monitors[0]->metricItems.empty());
    EXPECT_TRUE(monitors[0]->imperialItems.empty());
}

TEST(MonitorTestResult, ACanReplyWith46And10BytesIsRefused)
{
    support::LogCapture log;
    ExposedMonitorTestResult parameter(0x01);
    EXPECT_FALSE(offer(parameter, canEcu, "46 01 01 0A 00 01 00 00 00 02 01"));
    EXPECT_FALSE(parameter.fromBytes(canEcu, Bytes{}));
    EXPECT_EQ(log.lines(), (Texts{"ERROR Invalid number of data bytes: 11", "ERROR Invalid number of data bytes: 0"}));
    EXPECT_TRUE(parameter.getItems(*canEcu).empty());
}

// Skoda, engine module. 0.001 s and 1/8192 V a count.
TEST(MonitorTestResult, ReadsTheRearOxygenSensorOfARealCar)
{
    MonitorTestResult parameter(0x02);
    ASSERT_TRUE(offer(parameter, canEcu,
                      "46 02 05 10 00 3C 00 00 02 58 02 96 0A 06 36 00 00 06 68 02 95 0A 17 FC 17 FC 28 00"));
    auto const monitors = parameter.getItems(*canEcu);
    ASSERT_EQ(monitors.size(), 1U);
    EXPECT_EQ(monitors[0]->description, "Exhaust Gas Sensor Monitor Bank 1 - Sensor 2");
    EXPECT_EQ(results(*monitors[0], UnitSystem::Metric),
              (Texts{"5: 0.060 (0.000 to 0.600) 9 status 0", "96: 0.194092 (0.000000 to 0.200195) 4 status 0",
                     "95: 0.749512 (0.749512 to 1.250000) 4 status 0"}));
    EXPECT_EQ(results(*monitors[0], UnitSystem::Imperial), results(*monitors[0], UnitSystem::Metric));
    EXPECT_EQ(monitors[0]->metricItems[0]->description(), "Rich to lean sensor switch time (calculated)");
    EXPECT_EQ(monitors[0]->metricItems[1]->description(), "Manufacturer Defined Test");
}

// VW Golf: signed pressures of the boost control, 0.01 kPa a count.
TEST(MonitorTestResult, ReadsTheBoostControlOfARealCar)
{
    MonitorTestResult parameter(0x85);
    ASSERT_TRUE(offer(parameter, canEcu, "46 85 C1 FC 01 8C 80 00 0F A0 85 C2 FC FA 4D F4 48 7F FF"));
    auto const monitors = parameter.getItems(*canEcu);
    ASSERT_EQ(monitors.size(), 1U);
    EXPECT_EQ(monitors[0]->description, "Boost Pressure Control Monitor Bank 1");
    EXPECT_EQ(results(*monitors[0], UnitSystem::Metric),
              (Texts{"c1: 3.96 (-327.68 to 40.00) 14 status 0", "c2: -14.59 (-30.00 to 327.67) 14 status 0"}));
}

// VW Golf: the lambda control in percent of the 16 bit range, and the EGR monitor in tenths.
TEST(MonitorTestResult, ReadsSingleRecordsOfARealCar)
{
    MonitorTestResult lambda(0x01);
    ASSERT_TRUE(offer(lambda, canEcu, "46 01 C5 30 81 4A 5C 29 D5 C3"));
    EXPECT_EQ(results(*lambda.getItems(*canEcu).at(0), UnitSystem::Metric),
              Texts{"c5: 50.504311 (36.000610 to 83.501946) 10 status 0"});
    MonitorTestResult egr(0x31);
    ASSERT_TRUE(offer(egr, canEcu, "46 31 C0 82 FF F3 FF A6 00 A0"));
    EXPECT_EQ(egr.getItems(*canEcu).at(0)->description, "EGR Monitor Bank 1");
    EXPECT_EQ(results(*egr.getItems(*canEcu).at(0), UnitSystem::Metric), Texts{"c0: -1.3 (-9.0 to 16.0) 0 status 0"});
}

// Hyundai i10: the front oxygen sensor in 55 bytes; its last test has not run.
TEST(MonitorTestResult, ReadsTheFrontOxygenSensorOfARealCar)
{
    MonitorTestResult parameter(0x01);
    ASSERT_TRUE(offer(parameter, canEcu,
                      "46 01 01 0A 0E 66 0E 66 0E 66 01 02 0A 0E 66 0E 66 0E 66 01 07 0A 00 00 00 00 0C D8 "
                      "01 08 0A 1D 70 13 18 22 90 01 09 10 00 78 00 78 05 F0 01 0A 10 00 00 00 00 00 00"));
    EXPECT_EQ(results(*parameter.getItems(*canEcu).at(0), UnitSystem::Metric),
              (Texts{"1: 0.449951 (0.449951 to 0.449951) 4 status 0", "2: 0.449951 (0.449951 to 0.449951) 4 status 0",
                     "7: 0.000000 (0.000000 to 0.401367) 4 status 0", "8: 0.919922 (0.596680 to 1.080078) 4 status 0",
                     "9: 0.120 (0.120 to 1.520) 9 status 0", "a: 0.000 (0.000 to 0.000) 9 status 2"}));
}

TEST(MonitorTestResult, AForeignMonitorEndsTheReplyAndKeepsWhatCameBefore)
{
    support::LogCapture log;
    MonitorTestResult parameter(0x02);
    EXPECT_FALSE(offer(parameter, canEcu,
                       "46 02 05 10 00 3C 00 00 02 58 03 96 0A 06 36 00 00 06 68 02 95 0A 17 FC 17 FC 28 00"));
    EXPECT_EQ(log.lines(), Texts{"ERROR Invalid MID: 3 vs 2"});
    auto const monitors = parameter.getItems(*canEcu);
    ASSERT_EQ(monitors.size(), 1U);
    EXPECT_EQ(monitors[0]->metricItems.size(), 1U);
}

TEST(MonitorTestResult, ARecordWithAnUnknownScalingIsDroppedAndToldOnce)
{
    support::LogCapture log;
    MonitorTestResult parameter(0x02);
    ASSERT_TRUE(offer(parameter, canEcu, "46 02 05 47 00 3C 00 00 02 58 02 96 0A 06 36 00 00 06 68"));
    EXPECT_EQ(log.lines(),
              (Texts{"ERROR Invalid scaling ID: 71", "ERROR Failed to create unit scaler for scale ID: 71"}));
    auto const monitors = parameter.getItems(*canEcu);
    ASSERT_EQ(monitors.size(), 1U);
    EXPECT_EQ(monitors[0]->metricItems.size(), 1U);
    EXPECT_EQ(monitors[0]->imperialItems.size(), 1U);
}

TEST(MonitorTestResult, ItemsFollowTheUnitSystem)
{
    MonitorTestResult parameter(0x3D);
    ASSERT_TRUE(offer(parameter, canEcu, "46 3D 81 FE 0F A0 F0 60 1F 40"));
    auto const monitors = parameter.getItems(*canEcu);
    EXPECT_EQ(results(*monitors.at(0), UnitSystem::Metric), Texts{"81: 1000.00 (-1000.00 to 2000.00) 36 status 0"});
    EXPECT_EQ(results(*monitors.at(0), UnitSystem::Imperial), Texts{"81: 4.015 (-4.015 to 8.029) 43 status 0"});
}

TEST(MonitorTestResult, AFurtherReplyIsAppendedAndClearForgets)
{
    MonitorTestResult parameter(0xE5);
    ASSERT_TRUE(offer(parameter, canEcu, "46 E5 05 10 00 3C 00 00 02 58"));
    ASSERT_TRUE(offer(parameter, canEcu, "46 E5 06 10 00 3C 00 00 02 58"));
    ASSERT_EQ(parameter.getItems(*canEcu).size(), 2U);
    EXPECT_EQ(parameter.getItems(*canEcu)[1]->description, "Vehicle manufacturer defined monitor E5");
    parameter.clear();
    EXPECT_TRUE(parameter.getItems(*canEcu).empty());
}

TEST(MonitorTestResult, AModuleThatDidNotAnswerHasNoItemsAndALogLine)
{
    support::LogCapture log;
    EXPECT_TRUE(MonitorTestResult(0x01).getItems(*canEcu).empty());
    EXPECT_EQ(log.lines(), Texts{"ERROR invalid ECU id 2024"});
}

// Test 06 of four components, 0.004 s a count; as ISO 14230 gives it, and with checksums as ISO 9141-2 does.
TEST(MonitorTestResult, OnTheOlderBusesEachRecordIsAMonitorOfItsOwn)
{
    Bytes const data = support::hexBytes("46 06 03 00 5A 9C 40 46 06 85 00 5A 00 00 46 06 09 09 60 88 B8 "
                                         "46 06 8A 09 60 00 00");
    for (auto const& ecu : {kwpEcu, isoEcu}) {
        MonitorTestResult parameter(0x06);
        ASSERT_TRUE(parameter.setResponseData(ecu, ecu == isoEcu ? withChecksums(data) : data));
        auto const monitors = parameter.getItems(*ecu);
        ASSERT_EQ(monitors.size(), 4U);
        EXPECT_EQ(monitors[0]->id, 3U);
        EXPECT_EQ(monitors[1]->id, 5U);
        EXPECT_EQ(monitors[2]->id, 9U);
        EXPECT_EQ(monitors[3]->id, 0x0AU);
        EXPECT_EQ(monitors[3]->description, "Manufacturer specified component 0A");
        for (UnitSystem const system : {UnitSystem::Metric, UnitSystem::Imperial}) {
            EXPECT_EQ(results(*monitors[0], system), Texts{"6: 0.360 ( to 160.000) 9 status 0"});
            EXPECT_EQ(results(*monitors[1], system), Texts{"6: 0.360 (0.000 to ) 9 status 0"});
            EXPECT_EQ(results(*monitors[2], system), Texts{"6: 9.600 ( to 140.000) 9 status 0"});
            EXPECT_EQ(results(*monitors[3], system), Texts{"6: 9.600 (0.000 to ) 9 status 0"});
        }
    }
}

TEST(MonitorTestResult, RepliesOfTheOlderBusesThatAreNoWholeLinesAreRefused)
{
    support::LogCapture log;
    MonitorTestResult parameter(0x06);
    EXPECT_FALSE(offer(parameter, isoEcu, "46 06 03 00 5A 9C"));
    EXPECT_FALSE(offer(parameter, isoEcu, "46 06 03 00 5A 9C 40 46 06"));
    EXPECT_EQ(log.lines(), (Texts{"ERROR Invalid number of data bytes: 6", "ERROR Invalid data received"}));
    EXPECT_TRUE(parameter.getItems(*isoEcu).empty());
}

TEST(MonitorTestResult, RandomRepliesAreReadOrRefused)
{
    for (ObdProtocol const protocol : allProtocols) {
        auto const ecu = makeEcu(protocol, 0x10);
        forRandomReplies({0x46, 0x05, 0x01}, [&ecu](Bytes data) {
            MonitorTestResult parameter(0x05);
            bool const taken = parameter.setResponseData(ecu, data);
            auto const monitors = parameter.getItems(*ecu);
            EXPECT_LE(monitors.size(), data.size() / 7 + 1);
            EXPECT_TRUE(taken || monitors.size() <= 1)
                << "a refused reply leaves at most what came before a foreign record";
            for (auto const& monitor : monitors) {
                EXPECT_EQ(results(*monitor, UnitSystem::Imperial).size(), monitor->metricItems.size());
            }
        });
    }
}

} // namespace
