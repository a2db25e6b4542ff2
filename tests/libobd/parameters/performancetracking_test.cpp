#include "libobd/parameters/performancetracking.h"
#include "tests/libobd/parameters/diagnosticsrig.h"
#include "tests/support/logcapture.h"
#include "tests/support/tablefile.h"

#include <obd/diagnosticdatamodels.h>

#include <gtest/gtest.h>

namespace {

using namespace obd;
using namespace diagnosticsrig;
using Spark = PerformanceTrackingSpark;
using Compression = PerformanceTrackingCompression;
using Numbers = std::vector<int>;
using Texts = std::vector<std::string>;

// A reply on CAN whose counter i reads first + i.
Bytes canReply(unsigned char infoType, int count, int first)
{
    Bytes data{0x49, infoType, static_cast<unsigned char>(count)};
    for (int i = 0; i < count; ++i) {
        data.push_back(static_cast<unsigned char>((first + i) >> 8));
        data.push_back(static_cast<unsigned char>(first + i));
    }
    return data;
}

void expectTable(PerformanceTracking const& parameter, std::string const& file, std::size_t count)
{
    auto const rows = support::readTable(file);
    ASSERT_EQ(rows.size(), count);
    for (std::size_t i = 0; i < rows.size(); ++i) {
        EXPECT_EQ(rows[i].at(0), std::to_string(i));
        EXPECT_EQ(parameter.counterDescription(static_cast<int>(i)), rows[i].at(1));
    }
    support::LogCapture log;
    EXPECT_EQ(parameter.counterDescription(static_cast<int>(count)), "");
    EXPECT_EQ(parameter.counterDescription(-1), "");
    EXPECT_EQ(log.lines(), (Texts{"ERROR Invalid counter: " + std::to_string(count), "ERROR Invalid counter: -1"}));
}

TEST(PerformanceTracking, TablesAgreeRowByRow)
{
    expectTable(Spark(), "tests/libobd/parameters/performancecounters_spark.txt", 28);
    expectTable(Compression(), "tests/libobd/parameters/performancecounters_compression.txt", 18);
}

TEST(PerformanceTracking, AsksForItsInfoType)
{
    EXPECT_EQ(requestOf(Spark()), (Bytes{0x09, 0x08}));
    EXPECT_EQ(requestOf(Compression()), (Bytes{0x09, 0x0B}));
    EXPECT_EQ(Spark().timeout(), 1500U);
}

TEST(PerformanceTracking, ReadsTheCountersOfCanInOrder)
{
    Spark parameter;
    ASSERT_TRUE(parameter.setResponseData(canEcu, canReply(0x08, 28, 1000)));
    ASSERT_EQ(parameter.counters(*canEcu).size(), 28U);
    EXPECT_EQ(parameter.counterValue(*canEcu, Spark::ObdConditionsEncountered), 1000U);
    EXPECT_EQ(parameter.counterValue(*canEcu, Spark::ParticulateFilterEncounteredBank2), 1027U);
}

// The same counters as the lines of a legacy bus.
Bytes legacyReply(unsigned char infoType, int count, int first)
{
    Bytes const words = canReply(infoType, count, first);
    Bytes data;
    for (std::size_t at = 3; at < words.size(); at += 4) {
        data.insert(data.end(), {0x49, infoType, static_cast<unsigned char>(at / 4 + 1)});
        data.insert(data.end(), words.begin() + static_cast<std::ptrdiff_t>(at),
                    words.begin() + static_cast<std::ptrdiff_t>(at + 4));
    }
    return data;
}

// Counter i of the table has to be word i of the reply, on every bus.
template <typename Tracking>
void expectEveryCounterAtItsPlace(unsigned char infoType, int count)
{
    Bytes const lines = legacyReply(infoType, count, 0x1234);
    for (auto const& [ecu, data] :
         {std::pair(canEcu, canReply(infoType, count, 0x1234)), {isoEcu, lines}, {isoEcu, withChecksums(lines)}}) {
        Tracking parameter;
        ASSERT_TRUE(parameter.setResponseData(ecu, data));
        ASSERT_EQ(parameter.counters(*ecu).size(), static_cast<std::size_t>(count));
        for (int i = 0; i < count; ++i) {
            EXPECT_EQ(parameter.counters(*ecu)[static_cast<std::size_t>(i)], i);
            EXPECT_EQ(parameter.counterValue(*ecu, i), static_cast<unsigned int>(0x1234 + i));
        }
    }
}

TEST(PerformanceTracking, EveryCounterStandsAtItsPlaceOnEveryBus)
{
    expectEveryCounterAtItsPlace<Spark>(0x08, 28);
    expectEveryCounterAtItsPlace<Compression>(0x0B, 18);
}

TEST(PerformanceTracking, CountersOf0StandInNoListAndLogWhenRead)
{
    Compression parameter;
    Bytes data = canReply(0x0B, 16, 500);
    data[3] = data[4] = 0;
    data[3 + 2 * 15] = data[4 + 2 * 15] = 0;
    ASSERT_TRUE(parameter.setResponseData(canEcu, data));
    EXPECT_EQ(parameter.counters(*canEcu), (Numbers{1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14}));
    support::LogCapture log;
    EXPECT_EQ(parameter.counterValue(*canEcu, 0), 0U);
    EXPECT_EQ(log.lines(), Texts{"ERROR Invalid counter: 0"});
}

TEST(PerformanceTracking, CanRepliesOf34BytesAreRefusedWhateverTheirCount)
{
    support::LogCapture log;
    Spark parameter;
    Bytes data = canReply(0x08, 16, 1);
    data.pop_back();
    EXPECT_FALSE(parameter.setResponseData(canEcu, data));
    // A gearbox module of a real car, which reports 4 counters and says so.
    EXPECT_FALSE(offer(parameter, canEcu, "49 08 04 03 3F 0C A1 03 91 03 3F"));
    EXPECT_EQ(log.lines(), (Texts{"ERROR Invalid number of data bytes: 34", "ERROR Invalid number of data bytes: 11"}));
    EXPECT_TRUE(parameter.counters(*canEcu).empty());
}

TEST(PerformanceTracking, WordsBehindTheLastCounterAreIgnored)
{
    Compression parameter;
    ASSERT_TRUE(parameter.setResponseData(canEcu, canReply(0x0B, 30, 1)));
    EXPECT_EQ(parameter.counters(*canEcu).size(), 18U);
    Bytes odd = canReply(0x0B, 16, 1);
    odd.push_back(0x77);
    ASSERT_TRUE(parameter.setResponseData(canEcu, odd));
    EXPECT_EQ(parameter.counters(*canEcu).size(), 16U);
}

TEST(PerformanceTracking, LinesOfTheOlderBusesCarryTwoCountersEach)
{
    char const* const lines = "49 08 01 03 3F 0C A1 49 08 02 03 91 03 3F 49 08 03 00 00 00 07";
    for (bool const checksums : {false, true}) {
        Spark parameter;
        Bytes const data = support::hexBytes(lines);
        ASSERT_TRUE(parameter.setResponseData(isoEcu, checksums ? withChecksums(data) : data));
        EXPECT_EQ(parameter.counters(*isoEcu), (Numbers{0, 1, 2, 3, 5}));
        EXPECT_EQ(parameter.counterValue(*isoEcu, Spark::ObdConditionsEncountered), 831U);
        EXPECT_EQ(parameter.counterValue(*isoEcu, Spark::IgnitionCycles), 3233U);
        EXPECT_EQ(parameter.counterValue(*isoEcu, Spark::CatalystCompletedBank1), 913U);
        EXPECT_EQ(parameter.counterValue(*isoEcu, Spark::CatalystEncounteredBank1), 831U);
        EXPECT_EQ(parameter.counterValue(*isoEcu, 5), 7U);
    }
}

TEST(PerformanceTracking, RepliesThatAreNoWholeLinesAreRefused)
{
    support::LogCapture log;
    Spark parameter;
    EXPECT_FALSE(offer(parameter, isoEcu, "49 08 01 03 3F 0C"));
    EXPECT_FALSE(offer(parameter, isoEcu, "49 08 01 03 3F 0C A1 49 08 02"));
    EXPECT_EQ(log.lines(), (Texts{"ERROR Invalid number of data bytes: 6", "ERROR Invalid data received"}));
}

TEST(PerformanceTracking, ANewReplyReplacesAllCountersOfTheModule)
{
    Spark parameter;
    ASSERT_TRUE(offer(parameter, isoEcu, "49 08 01 03 3F 0C A1 49 08 02 03 91 03 3F"));
    ASSERT_TRUE(offer(parameter, isoEcu, "49 08 01 00 05 00 00"));
    EXPECT_EQ(parameter.counters(*isoEcu), Numbers{0});
    EXPECT_EQ(parameter.counterValue(*isoEcu, 0), 5U);
    parameter.clear();
    EXPECT_TRUE(parameter.counters(*isoEcu).empty());
}

TEST(PerformanceTracking, AModuleThatDidNotAnswerReads0WithALogLine)
{
    support::LogCapture log;
    Spark const parameter;
    EXPECT_EQ(parameter.counterValue(*canEcu, 0), 0U);
    EXPECT_TRUE(parameter.counters(*canEcu).empty());
    EXPECT_EQ(log.lines(), Texts{"ERROR invalid ECU id 2024"});
}

TEST(PerformanceTracking, RandomRepliesAreReadOrRefusedWithoutChange)
{
    for (ObdProtocol const protocol : allProtocols) {
        auto const ecu = makeEcu(protocol, 0x10);
        bool const can = protocol == ObdProtocolCan11 || protocol == ObdProtocolCan29;
        Bytes const goodReply = can ? canReply(0x0B, 16, 1) : support::hexBytes("49 0B 01 03 3F 0C A1");
        forRandomReplies({0x49, 0x0B}, [&ecu, &goodReply](Bytes const& data) {
            Compression parameter;
            ASSERT_TRUE(parameter.setResponseData(ecu, goodReply));
            Numbers const before = parameter.counters(*ecu);
            if (parameter.setResponseData(ecu, data)) {
                EXPECT_LE(parameter.counters(*ecu).size(), 18U);
            } else {
                EXPECT_EQ(parameter.counters(*ecu), before);
            }
        });
    }
}

TEST(PerformanceCounterDataModel, KeepsTheValueAsText)
{
    PerformanceCounterDataModel const model("Ignition Cycle Counter", 65535);
    EXPECT_EQ(model.description, "Ignition Cycle Counter");
    EXPECT_EQ(model.value, "65535");
    EXPECT_EQ(PerformanceCounterDataModel("", 4294967295U).value, "4294967295");
}

} // namespace
