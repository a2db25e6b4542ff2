#include "tests/support/fakeecu.h"
#include "tests/support/hexbytes.h"
#include "tests/support/parameterclasses.h"
#include "tests/support/payload/payload.h"
#include "tests/support/tablefile.h"

#include <gtest/gtest.h>

#include <map>
#include <set>

// Feeds replies to the classes and compares what the user reads with the decode tables and recorded_table.txt.
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

// " + " stands between sensors in the tables.
std::string withBars(std::string text)
{
    for (std::size_t at = text.find(" + "); at != std::string::npos; at = text.find(" + ", at)) {
        text[at + 1] = '|';
    }
    return text;
}

std::vector<DecodeRow> rowsOf(std::string const& file)
{
    std::vector<DecodeRow> result;
    for (auto const& cells : support::readTable("tests/libobd/powertrain/" + file)) {
        std::string const& imperial = cells.size() > 4 ? cells[4] : cells.at(3);
        result.push_back({cells.at(1), support::hexBytes(cells.at(2)), withBars(cells.at(3)), withBars(imperial),
                          cells.at(1) + " from " + cells.at(2)});
    }
    return result;
}

// All tables that tell each class from its lowest to its highest reply.
std::vector<DecodeRow> allRows()
{
    std::vector<DecodeRow> all;
    for (char const* file : {"decode_table.txt", "state_table.txt", "oxygen_table.txt", "multisensor_table.txt"}) {
        for (DecodeRow& row : rowsOf(file)) {
            all.push_back(std::move(row));
        }
    }
    return all;
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
    for (DecodeRow const& row : allRows()) {
        SCOPED_TRACE(row.trace);
        auto const parameter = support::liveParameter(row.className);
        ASSERT_TRUE(support::reply(*parameter, m_ecu, row.payload));
        expectTexts(*parameter, row);
    }
}

TEST_F(DecodeTable, RepliesOfRealCarsReadAsTheirOwnersSay)
{
    auto const recorded = rowsOf("recorded_table.txt");
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
    for (DecodeRow const& row : allRows()) {
        SCOPED_TRACE(row.trace);
        auto const parameter = support::parameterClasses().at(row.className)(ObdMode::FreezeFrame, 3);
        ASSERT_TRUE(support::reply(*parameter, m_ecu, row.payload));
        expectTexts(*parameter, row);
    }
}

// A checksum may trail the data on the legacy buses.
TEST_F(DecodeTable, BytesBehindTheDataChangeNothing)
{
    for (DecodeRow const& row : allRows()) {
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
    for (DecodeRow const& row : allRows()) {
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
    for (DecodeRow const& row : allRows()) {
        told.insert(row.className);
    }
    for (auto const& [name, make] : support::parameterClasses()) {
        EXPECT_EQ(told.count(name), 1u) << name;
    }
}

TEST_F(DecodeTable, ModulesKeepTheirReadingsApart)
{
    auto const other = std::make_shared<support::FakeEcu>(0x7E9);
    std::map<std::string, DecodeRow> firstRows;
    for (DecodeRow const& row : allRows()) {
        DecodeRow const& first = firstRows.try_emplace(row.className, row).first->second;
        SCOPED_TRACE(row.trace);
        auto const parameter = support::liveParameter(row.className);
        auto const unanswered = support::texts(*parameter, *other, UnitSystem::Metric);
        ASSERT_TRUE(support::reply(*parameter, m_ecu, row.payload));
        EXPECT_EQ(support::texts(*parameter, *other, UnitSystem::Metric), unanswered);
        ASSERT_TRUE(support::reply(*parameter, other, first.payload));
        expectTexts(*parameter, row);
        EXPECT_EQ(support::texts(*parameter, *other, UnitSystem::Metric), first.metric);
        parameter->clear();
        EXPECT_EQ(support::texts(*parameter, *m_ecu, UnitSystem::Metric), unanswered);
        EXPECT_EQ(support::texts(*parameter, *other, UnitSystem::Metric), unanswered);
    }
}

} // namespace
