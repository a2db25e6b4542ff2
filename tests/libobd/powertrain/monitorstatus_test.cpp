#include "libobd/powertrain/monitorstatus.h"
#include "tests/support/fakeecu.h"

#include <obd/sensorinfo.h>
#include <obd/sensorvalue.h>

#include <gtest/gtest.h>

#include <random>
#include <thread>

namespace {

using namespace obd;
using Bytes = std::vector<unsigned char>;

std::shared_ptr<IEcu> const engine = std::make_shared<support::FakeEcu>(0x7E8);

Bytes reply(unsigned char pid, Bytes const& word)
{
    Bytes data{0x41, pid};
    data.insert(data.end(), word.begin(), word.end());
    return data;
}

TEST(MonitorStatus, ReadsLampCodesAndMonitorsOfASparkEngine)
{
    MonitorStatus status;
    ASSERT_TRUE(status.setResponseData(engine, reply(0x01, {0x81, 0x07, 0x65, 0x04})));
    EXPECT_TRUE(status.isMalfunctionIndicatorLightOn(*engine));
    EXPECT_EQ(status.getNumberOfErrors(*engine), 1U);
    EXPECT_EQ(status.getIgnitionType(*engine), IgnitionType::Spark);
    for (ReadinessMonitorTest const test : {ReadinessMisfire, ReadinessFuelSystem, ReadinessComprehensiveComponent}) {
        EXPECT_TRUE(status.isTestAvailable(*engine, test)) << test;
        EXPECT_TRUE(status.isTestComplete(*engine, test)) << test;
    }
    EXPECT_TRUE(status.isTestAvailable(*engine, ReadinessEvaporativeSystem));
    EXPECT_FALSE(status.isTestComplete(*engine, ReadinessEvaporativeSystem));
}

TEST(MonitorStatus, Bit19TellsCompressionIgnition)
{
    MonitorStatus status;
    ASSERT_TRUE(status.setResponseData(engine, reply(0x01, {0x00, 0x0F, 0x00, 0x00})));
    EXPECT_EQ(status.getIgnitionType(*engine), IgnitionType::Compression);
}

TEST(MonitorStatus, CompleteBitClearWithoutAvailableBitIsNotComplete)
{
    MonitorStatus status;
    ASSERT_TRUE(status.setResponseData(engine, reply(0x01, {0x00, 0x00, 0x00, 0x00})));
    for (MonitorTestInfo const& info : MonitorStatus::TEST_INFO_ARRAY) {
        EXPECT_FALSE(status.isTestAvailable(*engine, info.test)) << info.test;
        EXPECT_FALSE(status.isTestComplete(*engine, info.test)) << info.test;
    }
}

TEST(MonitorStatus, Test12AndTest4ReadTheSameTwoBits)
{
    struct Case
    {
        Bytes word;
        bool available;
        bool complete;
    };
    for (Case const& c : {Case{{0, 0, 0x01, 0x00}, true, true}, Case{{0, 0, 0x01, 0x01}, true, false},
                          Case{{0, 0, 0xFE, 0x01}, false, false}, Case{{0, 0, 0xFE, 0x00}, false, false}}) {
        MonitorStatus status;
        ASSERT_TRUE(status.setResponseData(engine, reply(0x01, c.word)));
        for (ReadinessMonitorTest const test : {ReadinessCatalyst, ReadinessNmhcCatalyst}) {
            EXPECT_EQ(status.isTestAvailable(*engine, test), c.available);
            EXPECT_EQ(status.isTestComplete(*engine, test), c.complete);
        }
    }
}

TEST(MonitorStatus, CountsUpTo127CodesBesideTheLamp)
{
    MonitorStatus status;
    ASSERT_TRUE(status.setResponseData(engine, reply(0x01, {0x7F, 0, 0, 0})));
    EXPECT_EQ(status.getNumberOfErrors(*engine), 127U);
    EXPECT_FALSE(status.isMalfunctionIndicatorLightOn(*engine));
    ASSERT_TRUE(status.setResponseData(engine, reply(0x01, {0x80, 0, 0, 0})));
    EXPECT_EQ(status.getNumberOfErrors(*engine), 0U);
    EXPECT_TRUE(status.isMalfunctionIndicatorLightOn(*engine));
}

TEST(MonitorStatus, EveryQuestionHasAnAnswerForAModuleThatSaidNothing)
{
    MonitorStatus const status;
    EXPECT_EQ(status.getNumberOfErrors(*engine), 0U);
    EXPECT_FALSE(status.isMalfunctionIndicatorLightOn(*engine));
    EXPECT_EQ(status.getIgnitionType(*engine), IgnitionType::Spark);
    EXPECT_FALSE(status.isTestAvailable(*engine, ReadinessMisfire));
    EXPECT_FALSE(status.isTestComplete(*engine, ReadinessMisfire));
}

TEST(MonitorStatus, TestsOutsideTheTableAreNeitherAvailableNorComplete)
{
    MonitorStatus status;
    ASSERT_TRUE(status.setResponseData(engine, reply(0x01, {0xFF, 0xFF, 0xFF, 0x00})));
    for (int const test : {-1, 18, 255}) {
        EXPECT_FALSE(status.isTestAvailable(*engine, static_cast<ReadinessMonitorTest>(test)));
        EXPECT_FALSE(status.isTestComplete(*engine, static_cast<ReadinessMonitorTest>(test)));
    }
}

TEST(MonitorStatus, KeepsTheModulesApartAndForgetsOnClear)
{
    auto const gearbox = std::make_shared<support::FakeEcu>(0x7E9);
    MonitorStatus status;
    ASSERT_TRUE(status.setResponseData(engine, reply(0x01, {0x82, 0x07, 0xE5, 0x00})));
    ASSERT_TRUE(status.setResponseData(gearbox, reply(0x01, {0x00, 0x04, 0x00, 0x00})));
    EXPECT_EQ(status.getNumberOfErrors(*engine), 2U);
    EXPECT_EQ(status.getNumberOfErrors(*gearbox), 0U);
    EXPECT_FALSE(status.isTestAvailable(*gearbox, ReadinessMisfire));
    EXPECT_TRUE(status.isTestComplete(*gearbox, ReadinessComprehensiveComponent));
    status.clear();
    EXPECT_EQ(status.getNumberOfErrors(*engine), 0U);
}

TEST(MonitorStatus, AsksForPid01AndOffersNoSensorValues)
{
    MonitorStatus status;
    Bytes request;
    status.requestData(request);
    EXPECT_EQ(request, (Bytes{0x01, 0x01}));
    EXPECT_EQ(status.timeout(), 2500U);
    EXPECT_EQ(status.description(*engine), "Monitor status since DTCs cleared");
    ASSERT_EQ(status.sensorInfo(*engine).size(), 1U);
    EXPECT_EQ(status.sensorInfo(*engine)[0]->uid(), 10);
    EXPECT_EQ(status.sensorInfo(*engine)[0]->description(), "Monitor status since DTCs cleared");
    EXPECT_FALSE(status.sensorInfo(*engine)[0]->isNumeric());
    ASSERT_TRUE(status.setResponseData(engine, reply(0x01, {0x82, 0x07, 0xE5, 0x00})));
    EXPECT_TRUE(status.values(*engine, UnitSystem::Metric).empty());
}

TEST(MonitorStatusThisCycle, AsksForPid41)
{
    MonitorStatusThisCycle status;
    Bytes request;
    status.requestData(request);
    EXPECT_EQ(request, (Bytes{0x01, 0x41}));
    EXPECT_EQ(status.timeout(), 2500U);
    EXPECT_EQ(status.pid(), 0x41);
    EXPECT_EQ(status.description(*engine), "Monitor status this driving cycle");
    EXPECT_EQ(status.sensorInfo(*engine).at(0)->uid(), 650);
    EXPECT_FALSE(status.sensorInfo(*engine)[0]->isNumeric());
    EXPECT_TRUE(status.values(*engine, UnitSystem::Imperial).empty());
}

// A car's own readings: all monitors done since the clearing, four of them not yet in this cycle.
TEST(MonitorStatusThisCycle, ReadsEnabledAndCompleteOfARealCar)
{
    MonitorStatus status;
    MonitorStatusThisCycle thisCycle;
    ASSERT_TRUE(status.setResponseData(engine, reply(0x01, {0x00, 0x07, 0xF1, 0x00})));
    ASSERT_TRUE(thisCycle.setResponseData(engine, reply(0x41, {0x00, 0x07, 0xB1, 0xB1})));
    EXPECT_EQ(status.getIgnitionType(*engine), IgnitionType::Spark);
    for (ReadinessMonitorTest const test :
         {ReadinessCatalyst, ReadinessGasolineParticulateFilter, ReadinessOxygenSensor, ReadinessEgrVvtSystem}) {
        EXPECT_TRUE(status.isTestComplete(*engine, test)) << test;
        EXPECT_TRUE(thisCycle.isTestEnabled(*engine, test)) << test;
        EXPECT_FALSE(thisCycle.isTestComplete(*engine, test)) << test;
    }
    EXPECT_TRUE(status.isTestAvailable(*engine, ReadinessOxygenSensorHeater));
    EXPECT_FALSE(thisCycle.isTestEnabled(*engine, ReadinessOxygenSensorHeater));
    EXPECT_TRUE(thisCycle.isTestComplete(*engine, ReadinessMisfire));
    EXPECT_FALSE(status.isTestAvailable(*engine, ReadinessEvaporativeSystem));
}

TEST(MonitorStatus, RepliesOfAnyLengthAreReadOrRefusedWithoutChange)
{
    std::mt19937 random(20251121);
    for (unsigned int protocol = ObdProtocolIso9141; protocol <= ObdProtocolUnknown; ++protocol) {
        auto const ecu = std::make_shared<support::FakeEcu>(0x10);
        ecu->setProtocol(static_cast<ObdProtocol>(protocol));
        for (std::size_t length = 0; length <= 40; ++length) {
            Bytes data(length);
            for (unsigned char& byte : data) {
                byte = static_cast<unsigned char>(random());
            }
            MonitorStatus status;
            ASSERT_TRUE(status.setResponseData(ecu, reply(0x01, {0x85, 0, 0, 0})));
            bool const taken = status.setResponseData(ecu, reply(0x01, data));
            EXPECT_EQ(taken, length >= 4);
            EXPECT_EQ(status.getNumberOfErrors(*ecu), taken ? data[0] & 0x7FU : 5U);
            EXPECT_FALSE(status.setResponseData(ecu, Bytes(length, 0x00)));
        }
    }
}

// Run under ThreadSanitizer: the keep-alive feeds the object on the worker thread while others ask it.
TEST(MonitorStatus, IsFedOnOneThreadAndAskedOnAnother)
{
    MonitorStatus status;
    std::thread feeder([&status] {
        for (unsigned char codes = 1; codes < 100; ++codes) {
            status.setResponseData(engine, reply(0x01, {codes, 0x07, 0x00, 0x00}));
        }
    });
    unsigned int last = 0;
    for (int i = 0; i < 100; ++i) {
        unsigned int const codes = status.getNumberOfErrors(*engine);
        EXPECT_GE(codes, last);
        last = codes;
    }
    feeder.join();
    EXPECT_EQ(status.getNumberOfErrors(*engine), 99U);
}

} // namespace
