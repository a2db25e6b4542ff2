#include "libobd/powertrain/readinessmonitors.h"
#include "tests/support/fakeecu.h"
#include "tests/support/tablefile.h"

#include <gtest/gtest.h>

namespace {

using namespace obd;
using Bytes = std::vector<unsigned char>;
using Model = ReadinessMonitorDataModel;

std::shared_ptr<IEcu> const engineModule = std::make_shared<support::FakeEcu>(0x7E8);

TEST(ReadinessMonitors, TableAgreesRowByRow)
{
    auto const rows = support::readTable("tests/libobd/powertrain/readinessmonitors.txt");
    ASSERT_EQ(rows.size(), MonitorStatus::TEST_INFO_ARRAY_SIZE);
    ASSERT_EQ(rows.size(), MonitorStatusThisCycle::TEST_INFO_ARRAY_SIZE);
    for (std::size_t i = 0; i < rows.size(); ++i) {
        MonitorTestInfo const& info = MonitorStatus::TEST_INFO_ARRAY[i];
        EXPECT_EQ(rows[i],
                  (std::vector<std::string>{std::to_string(info.test), std::to_string(info.availableBit),
                                            std::to_string(info.completeBit), readinessMonitorText(info.test)}));
    }
}

// A word in which the two bits are set as told and all others the other way round, so that none of them can stand in.
Bytes wordOf(unsigned char pid, unsigned int availableBit, bool available, unsigned int completeBit, bool incomplete,
             bool others)
{
    unsigned int word = others ? 0xFFFFFFFFU : 0U;
    word = available ? word | 1U << availableBit : word & ~(1U << availableBit);
    word = incomplete ? word | 1U << completeBit : word & ~(1U << completeBit);
    return {0x41,
            pid,
            static_cast<unsigned char>(word >> 24U),
            static_cast<unsigned char>(word >> 16U),
            static_cast<unsigned char>(word >> 8U),
            static_cast<unsigned char>(word)};
}

void expectStates(ReadinessMonitorTest test, unsigned int availableBit, unsigned int completeBit, unsigned int bits)
{
    bool const available = (bits & 1U) != 0;
    bool const incomplete = (bits & 2U) != 0;
    bool const enabled = (bits & 4U) != 0;
    bool const cycleIncomplete = (bits & 8U) != 0;
    bool const others = (bits & 16U) != 0;
    MonitorStatus status;
    MonitorStatusThisCycle cycle;
    ASSERT_TRUE(
        status.setResponseData(engineModule, wordOf(0x01, availableBit, available, completeBit, incomplete, others)));
    ASSERT_TRUE(
        cycle.setResponseData(engineModule, wordOf(0x41, availableBit, enabled, completeBit, cycleIncomplete, others)));
    EXPECT_EQ(readinessSinceCleared(*engineModule, status, test), !available   ? Model::NotAvailable
                                                                  : incomplete ? Model::NotComplete
                                                                               : Model::Complete);
    EXPECT_EQ(readinessThisCycle(*engineModule, status, cycle, test), !available        ? Model::NotAvailable
                                                                      : !enabled        ? Model::DisabledThisCycle
                                                                      : cycleIncomplete ? Model::NotComplete
                                                                                        : Model::Complete);
}

TEST(ReadinessMonitors, EveryMonitorFollowsTheBitsOfTheTable)
{
    for (auto const& row : support::readTable("tests/libobd/powertrain/readinessmonitors.txt")) {
        auto const availableBit = static_cast<unsigned int>(std::stoul(row.at(1)));
        auto const completeBit = static_cast<unsigned int>(std::stoul(row.at(2)));
        for (unsigned int bits = 0; bits < 32; ++bits) {
            SCOPED_TRACE(row.at(0) + " with " + std::to_string(bits));
            expectStates(static_cast<ReadinessMonitorTest>(std::stoi(row.at(0))), availableBit, completeBit, bits);
        }
    }
}

TEST(ReadinessMonitors, NumbersOutsideTheTableReadNa)
{
    EXPECT_EQ(readinessMonitorText(static_cast<ReadinessMonitorTest>(18)), "NA");
    EXPECT_EQ(readinessMonitorText(static_cast<ReadinessMonitorTest>(-1)), "NA");
}

TEST(ReadinessMonitors, ListFollowsTheIgnitionType)
{
    using Tests = std::vector<ReadinessMonitorTest>;
    EXPECT_EQ(readinessMonitorTests(IgnitionType::Spark),
              (Tests{ReadinessMisfire, ReadinessFuelSystem, ReadinessComprehensiveComponent, ReadinessCatalyst,
                     ReadinessHeatedCatalyst, ReadinessEvaporativeSystem, ReadinessSecondaryAirSystem,
                     ReadinessGasolineParticulateFilter, ReadinessOxygenSensor, ReadinessOxygenSensorHeater,
                     ReadinessEgrVvtSystem}));
    EXPECT_EQ(readinessMonitorTests(IgnitionType::Compression),
              (Tests{ReadinessMisfire, ReadinessFuelSystem, ReadinessComprehensiveComponent, ReadinessNmhcCatalyst,
                     ReadinessNoxAftertreatment, ReadinessBoostPressure, ReadinessExhaustGasSensor, ReadinessPmFilter,
                     ReadinessEgrVvtSystemCompression}));
}

TEST(ReadinessMonitors, StatusSinceCleared)
{
    MonitorStatus status;
    ASSERT_TRUE(status.setResponseData(engineModule, Bytes{0x41, 0x01, 0x81, 0x07, 0x65, 0x04}));
    EXPECT_EQ(readinessSinceCleared(*engineModule, status, ReadinessMisfire), Model::Complete);
    EXPECT_EQ(readinessSinceCleared(*engineModule, status, ReadinessEvaporativeSystem), Model::NotComplete);
    EXPECT_EQ(readinessSinceCleared(*engineModule, status, ReadinessHeatedCatalyst), Model::NotAvailable);
}

TEST(ReadinessMonitors, StatusThisCycle)
{
    MonitorStatus status;
    MonitorStatusThisCycle thisCycle;
    ASSERT_TRUE(status.setResponseData(engineModule, Bytes{0x41, 0x01, 0x00, 0x07, 0x07, 0x07}));
    ASSERT_TRUE(thisCycle.setResponseData(engineModule, Bytes{0x41, 0x41, 0x00, 0x07, 0x0B, 0x02}));
    EXPECT_EQ(readinessThisCycle(*engineModule, status, thisCycle, ReadinessCatalyst), Model::Complete);
    EXPECT_EQ(readinessThisCycle(*engineModule, status, thisCycle, ReadinessHeatedCatalyst), Model::NotComplete);
    EXPECT_EQ(readinessThisCycle(*engineModule, status, thisCycle, ReadinessEvaporativeSystem),
              Model::DisabledThisCycle);
    // Enabled in the cycle's word, but the vehicle says that it has no such monitor.
    EXPECT_EQ(readinessThisCycle(*engineModule, status, thisCycle, ReadinessSecondaryAirSystem), Model::NotAvailable);
}

TEST(ReadinessMonitors, StatusNumbersStandFirm)
{
    EXPECT_EQ(Model::Complete, 0);
    EXPECT_EQ(Model::NotComplete, 1);
    EXPECT_EQ(Model::DisabledThisCycle, 2);
    EXPECT_EQ(Model::NotAvailable, 3);
    Model const model("Catalyst", Model::DisabledThisCycle);
    EXPECT_EQ(model.description, "Catalyst");
    EXPECT_EQ(model.status, 2);
}

} // namespace
