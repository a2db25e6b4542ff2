#include "tests/support/fakeecu.h"
#include "tests/support/hexbytes.h"
#include "tests/support/parameterclasses.h"
#include "tests/support/payload.h"
#include "tests/support/payloadproperty.h"
#include "tests/support/tablefile.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <set>
#include <tuple>

// Feeds replies to the classes and compares what the user reads with decode_table.txt and recorded_table.txt.
namespace {

using obd::ObdMode;
using obd::UnitSystem;
using support::Bytes;

struct DecodeRow
{
    std::string className;
    Bytes payload;
    std::string metric;
    std::string imperial;
    std::string trace;
};

std::vector<DecodeRow> rows(std::string const& file)
{
    std::vector<DecodeRow> result;
    for (auto const& cells : support::readTable("tests/libobd/powertrain/" + file)) {
        result.push_back({cells.at(1), support::hexBytes(cells.at(2)), cells.at(3), cells.at(4),
                          cells.at(1) + " from " + cells.at(2)});
    }
    return result;
}

class DecodeTable : public ::testing::Test
{
protected:
    void SetUp() override { obd::FuelTrim::setByteBInUse(false); }

    void expectTexts(obd::PowertrainParameter& parameter, DecodeRow const& row) const
    {
        EXPECT_EQ(support::texts(parameter, *m_ecu, UnitSystem::Metric), row.metric);
        EXPECT_EQ(support::texts(parameter, *m_ecu, UnitSystem::Imperial), row.imperial);
    }

    std::shared_ptr<support::FakeEcu> m_ecu = std::make_shared<support::FakeEcu>();
};

TEST_F(DecodeTable, RepliesReadAsTheTableSays)
{
    for (DecodeRow const& row : rows("decode_table.txt")) {
        SCOPED_TRACE(row.trace);
        auto const parameter = support::liveParameter(row.className);
        ASSERT_TRUE(support::reply(*parameter, m_ecu, row.payload));
        expectTexts(*parameter, row);
    }
}

TEST_F(DecodeTable, RepliesOfRealCarsReadAsTheirOwnersSay)
{
    auto const recorded = rows("recorded_table.txt");
    EXPECT_GE(recorded.size(), 40u);
    for (DecodeRow const& row : recorded) {
        SCOPED_TRACE(row.trace);
        auto const parameter = support::liveParameter(row.className);
        ASSERT_TRUE(support::reply(*parameter, m_ecu, row.payload));
        expectTexts(*parameter, row);
    }
}

TEST_F(DecodeTable, FreezeFramesReadTheSame)
{
    for (DecodeRow const& row : rows("decode_table.txt")) {
        SCOPED_TRACE(row.trace);
        auto const parameter = support::parameterClasses().at(row.className)(ObdMode::FreezeFrame, 3);
        ASSERT_TRUE(support::reply(*parameter, m_ecu, row.payload));
        expectTexts(*parameter, row);
    }
}

// A checksum may trail the data on the older buses.
TEST_F(DecodeTable, BytesBehindTheDataChangeNothing)
{
    for (DecodeRow const& row : rows("decode_table.txt")) {
        SCOPED_TRACE(row.trace);
        auto const parameter = support::liveParameter(row.className);
        Bytes payload = row.payload;
        payload.insert(payload.end(), {0xA5, 0xFF, 0x00});
        ASSERT_TRUE(support::reply(*parameter, m_ecu, payload));
        expectTexts(*parameter, row);
    }
}

TEST_F(DecodeTable, AShortReplyIsRefusedAndLeavesTheLastReading)
{
    for (DecodeRow const& row : rows("decode_table.txt")) {
        SCOPED_TRACE(row.trace);
        auto const parameter = support::liveParameter(row.className);
        ASSERT_TRUE(support::reply(*parameter, m_ecu, row.payload));
        EXPECT_FALSE(support::reply(*parameter, m_ecu, Bytes(row.payload.begin(), row.payload.end() - 1)));
        EXPECT_FALSE(support::reply(*parameter, m_ecu, {}));
        expectTexts(*parameter, row);
    }
}

TEST_F(DecodeTable, EveryClassIsInTheTable)
{
    std::set<std::string> told;
    for (DecodeRow const& row : rows("decode_table.txt")) {
        told.insert(row.className);
    }
    for (auto const& [name, make] : support::parameterClasses()) {
        EXPECT_EQ(told.count(name), 1u) << name;
    }
}

TEST_F(DecodeTable, ModulesKeepTheirReadingsApart)
{
    auto const other = std::make_shared<support::FakeEcu>(0x7E9);
    for (auto const& [name, make] : support::parameterClasses()) {
        SCOPED_TRACE(name);
        auto const parameter = support::liveParameter(name);
        auto const unanswered = support::texts(*parameter, *m_ecu, UnitSystem::Metric);
        Bytes const low(40, 0x11);
        Bytes const high(40, 0x71);
        ASSERT_TRUE(support::reply(*parameter, m_ecu, low));
        auto const first = support::texts(*parameter, *m_ecu, UnitSystem::Metric);
        ASSERT_TRUE(support::reply(*parameter, other, high));
        EXPECT_EQ(support::texts(*parameter, *m_ecu, UnitSystem::Metric), first);
        EXPECT_NE(support::texts(*parameter, *other, UnitSystem::Metric), first);
        parameter->clear();
        EXPECT_EQ(support::texts(*parameter, *m_ecu, UnitSystem::Metric), unanswered);
        EXPECT_EQ(support::texts(*parameter, *other, UnitSystem::Metric), unanswered);
    }
}

class AnyPayload : public ::testing::TestWithParam<std::tuple<obd::ObdProtocol, bool>>
{
protected:
    void SetUp() override { obd::FuelTrim::setByteBInUse(std::get<1>(GetParam())); }
    void TearDown() override { obd::FuelTrim::setByteBInUse(false); }

    Bytes randomPayload(std::size_t length)
    {
        Bytes payload(length);
        std::generate(payload.begin(), payload.end(), [this] { return static_cast<unsigned char>(m_random()); });
        return payload;
    }

    std::shared_ptr<support::FakeEcu> m_ecu = std::make_shared<support::FakeEcu>(0x10, std::get<0>(GetParam()));
    std::mt19937 m_random{1};
};

TEST_P(AnyPayload, IsReadOrRefusedByEveryClassBeforeAndAfterAGoodOne)
{
    for (auto const& [name, make] : support::parameterClasses()) {
        for (std::size_t length = 0; length <= 40; ++length) {
            auto const parameter = support::liveParameter(name);
            Bytes const payload = randomPayload(length);
            EXPECT_EQ(support::brokenBy(*parameter, m_ecu, payload), "") << name << " of " << length << " bytes";
            ASSERT_TRUE(support::reply(*parameter, m_ecu, Bytes(40, 0x01))) << name;
            EXPECT_EQ(support::brokenBy(*parameter, m_ecu, payload), "") << name << " of " << length << " bytes";
        }
    }
}

INSTANTIATE_TEST_SUITE_P(
    OnEveryBus, AnyPayload,
    ::testing::Values(std::tuple(obd::ObdProtocolIso9141, false), std::tuple(obd::ObdProtocolIso14230, false),
                      std::tuple(obd::ObdProtocolJ1850, false), std::tuple(obd::ObdProtocolCan11, false),
                      std::tuple(obd::ObdProtocolCan11, true), std::tuple(obd::ObdProtocolCan29, false)));

} // namespace
