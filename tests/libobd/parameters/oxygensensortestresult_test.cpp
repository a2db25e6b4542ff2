#include "libobd/parameters/oxygensensortestresult.h"
#include "tests/libobd/parameters/diagnosticsrig.h"
#include "tests/support/logcapture.h"
#include "tests/support/tablefile.h"

#include <gtest/gtest.h>

namespace {

using namespace obd;
using namespace diagnosticsrig;
using Texts = std::vector<std::string>;

constexpr OxygenSensorLocation front = OxygenSensorLocation::Bank1Sensor1;

// "0.500 (0.000 to 1.275) 4 status 0"
std::string text(OxygenSensorMonitorDataModel const& model)
{
    return model.value + " (" + model.minimum + " to " + model.maximum + ") " + std::to_string(model.unit) +
           " status " + std::to_string(model.status);
}

TEST(OxygenSensorTestResult, AsksForTestAndSensor)
{
    EXPECT_EQ(requestOf(OxygenSensorTestResult(0x05, front)), (Bytes{0x05, 0x05, 0x01}));
    EXPECT_EQ(requestOf(OxygenSensorTestResult(0x07, OxygenSensorLocation::Bank2Sensor2)), (Bytes{0x05, 0x07, 0x20}));
    EXPECT_EQ(OxygenSensorTestResult(0x05, front).timeout(), 1500U);
}

TEST(OxygenSensorTestResult, Test1IsAConstantOf4Bytes)
{
    OxygenSensorTestResult parameter(0x01, front);
    ASSERT_TRUE(offer(parameter, isoEcu, "45 01 01 64"));
    auto const result = parameter.getResult(isoEcu);
    ASSERT_NE(result, nullptr);
    EXPECT_EQ(result->tid, 1);
    EXPECT_EQ(result->description, "Rich to lean sensor threshold voltage (constant)");
    EXPECT_EQ(text(*result), "0.500 (0.000 to 1.275) 4 status 0");
}

TEST(OxygenSensorTestResult, Tests1To4NeedNoLimitsAndTheOthersDo)
{
    for (int tid = 0; tid < 256; ++tid) {
        auto const id = static_cast<unsigned char>(tid);
        OxygenSensorTestResult parameter(id, front);
        EXPECT_EQ(parameter.setResponseData(isoEcu, Bytes{0x45, id, 0x01, 0x64}), tid >= 1 && tid <= 4) << tid;
        EXPECT_TRUE(parameter.setResponseData(isoEcu, Bytes{0x45, id, 0x01, 0x64, 0x00, 0xFF})) << tid;
    }
}

TEST(OxygenSensorTestResult, Test5With5BytesIsRefused)
{
    support::LogCapture log;
    OxygenSensorTestResult parameter(0x05, front);
    EXPECT_FALSE(offer(parameter, isoEcu, "45 05 01 64 00"));
    EXPECT_FALSE(offer(parameter, isoEcu, "45 05 01"));
    EXPECT_EQ(log.lines(),
              (Texts{"FATAL TID 5: invalid number of data bytes: 5", "FATAL Invalid number of data bytes: 3"}));
    EXPECT_EQ(parameter.getResult(isoEcu), nullptr);
}

TEST(OxygenSensorTestResult, ARawValueAboveTheMaximumIsOutside)
{
    OxygenSensorTestResult parameter(0x05, front);
    ASSERT_TRUE(offer(parameter, isoEcu, "45 05 01 C8 10 80"));
    EXPECT_EQ(text(*parameter.getResult(isoEcu)), "0.800 (0.064 to 0.512) 9 status 1");
    EXPECT_EQ(parameter.getResult(isoEcu)->description, "Rich to lean sensor switch time (calculated)");
    ASSERT_TRUE(offer(parameter, isoEcu, "45 05 01 80 10 80"));
    EXPECT_EQ(parameter.getResult(isoEcu)->status, 0);
    ASSERT_TRUE(offer(parameter, isoEcu, "45 05 01 10 10 80"));
    EXPECT_EQ(parameter.getResult(isoEcu)->status, 0);
    ASSERT_TRUE(offer(parameter, isoEcu, "45 05 01 0F 10 80 5B")); // with the checksum of its line
    EXPECT_EQ(text(*parameter.getResult(isoEcu)), "0.060 (0.064 to 0.512) 9 status 1");
}

TEST(OxygenSensorTestResult, TestsWithoutAScalingAreShownAsTheyCame)
{
    OxygenSensorTestResult parameter(0x20, front);
    ASSERT_TRUE(offer(parameter, isoEcu, "45 20 01 C8 00 FF"));
    EXPECT_EQ(text(*parameter.getResult(isoEcu)), "200 (0 to 255) 0 status 0");
    EXPECT_EQ(parameter.getResult(isoEcu)->description, "NA");
}

// Of one test: 01 between 00 and 80, then FF above 01 to 80.
void expectWritten(std::vector<std::string> const& row, unsigned char tid)
{
    std::vector<std::string> const texts(row.begin() + 3, row.end());
    OxygenSensorTestResult parameter(tid, front);
    ASSERT_TRUE(parameter.setResponseData(isoEcu, Bytes{0x45, tid, 0x01, 0x01, 0x00, 0x80}));
    auto const within = parameter.getResult(isoEcu);
    ASSERT_TRUE(parameter.setResponseData(isoEcu, Bytes{0x45, tid, 0x01, 0xFF, 0x01, 0x80}));
    auto const above = parameter.getResult(isoEcu);
    EXPECT_EQ(within->tid, tid);
    EXPECT_EQ(within->description, row.at(1));
    EXPECT_EQ(std::to_string(within->unit), row.at(2));
    bool const constant = tid >= 1 && tid <= 4; // has the whole range, whatever stands behind the value
    EXPECT_EQ((Texts{within->value, within->minimum, within->maximum}),
              (Texts{texts.at(1), texts.at(0), texts.at(constant ? 3 : 2)}));
    EXPECT_EQ((Texts{above->value, above->minimum, above->maximum}),
              (Texts{texts.at(3), texts.at(constant ? 0 : 1), texts.at(constant ? 3 : 2)}));
    EXPECT_EQ(within->status, 0);
    EXPECT_EQ(above->status, constant ? 0 : 1);
}

TEST(OxygenSensorTestResult, EveryTestReadsAsTheTableSays)
{
    unsigned int expected = 0;
    for (auto const& row : support::readTable("tests/libobd/parameters/oxygentests.txt")) {
        auto const first = static_cast<unsigned int>(std::stoul(row.at(0).substr(0, 2), nullptr, 16));
        auto const last = static_cast<unsigned int>(std::stoul(row.at(0).substr(row.at(0).size() - 2), nullptr, 16));
        EXPECT_EQ(first, expected) << "a test is missing or told twice";
        for (unsigned int tid = first; tid <= last; ++tid) {
            SCOPED_TRACE(tid);
            expectWritten(row, static_cast<unsigned char>(tid));
        }
        expected = last + 1;
    }
    EXPECT_EQ(expected, 256U);
}

TEST(OxygenSensorTestResult, AnEcuThatDidNotAnswerHasNoResultAndALogLine)
{
    support::LogCapture log;
    OxygenSensorTestResult parameter(0x05, front);
    EXPECT_EQ(parameter.getResult(isoEcu), nullptr);
    EXPECT_EQ(log.lines(), Texts{"ERROR invalid ECU id 16"});
    ASSERT_TRUE(offer(parameter, isoEcu, "45 05 01 0F 10 80"));
    parameter.clear();
    EXPECT_EQ(parameter.getResult(isoEcu), nullptr);
}

TEST(OxygenSensorTestResult, AnotherSensorIsAnotherReply)
{
    OxygenSensorTestResult parameter(0x05, front);
    EXPECT_FALSE(offer(parameter, isoEcu, "45 05 02 0F 10 80"));
}

TEST(OxygenSensorTestResult, ANewResultReplacesTheOldWithoutTouchingIt)
{
    OxygenSensorTestResult parameter(0x05, front);
    ASSERT_TRUE(offer(parameter, isoEcu, "45 05 01 0F 10 80"));
    auto const first = parameter.getResult(isoEcu);
    ASSERT_TRUE(offer(parameter, isoEcu, "45 05 01 20 10 80"));
    EXPECT_EQ(first->value, "0.060");
    EXPECT_EQ(parameter.getResult(isoEcu)->value, "0.128");
}

TEST(OxygenSensorTestResult, RandomRepliesAreReadOrRefusedWithoutChange)
{
    for (ObdProtocol const protocol : allProtocols) {
        auto const ecu = makeEcu(protocol, 0x10);
        forRandomReplies({0x45, 0x05, 0x01}, [&ecu](Bytes const& data) {
            OxygenSensorTestResult parameter(0x05, front);
            ASSERT_TRUE(offer(parameter, ecu, "45 05 01 0F 10 80"));
            auto const before = parameter.getResult(ecu);
            bool const taken = parameter.setResponseData(ecu, data);
            EXPECT_EQ(parameter.getResult(ecu) != before, taken);
        });
    }
}

} // namespace
