#include "libobd/value/unitscalingfactory.h"
#include "libobd/value/unitscalingtables.h"
#include "tests/support/logcapture.h"
#include "tests/support/tablefile.h"

#include <gtest/gtest.h>

#include <sstream>

namespace {

using namespace obd;
using UnitScalingFactory::createForCan;
using UnitScalingFactory::createForTest;
using Cells = std::vector<std::string>;

unsigned int hex(std::string const& text)
{
    return static_cast<unsigned int>(std::stoul(text, nullptr, 16));
}

std::string shown(IUnitScaling const& scaling, unsigned int raw)
{
    return scaling.toString(scaling.value(raw));
}

void expectRow(Cells const& row, ScalingRow const& scaling)
{
    EXPECT_EQ(hex(row.at(0)), scaling.id) << row.at(0);
    EXPECT_EQ(std::stod(row.at(1)), scaling.factor) << row.at(0);
    EXPECT_EQ(std::stoi(row.at(2)), scaling.decimals) << row.at(0);
    EXPECT_EQ(std::stoi(row.at(3)), scaling.unit) << row.at(0);
}

TEST(UnitScalingTables, MetricScalingsAgreeRowByRow)
{
    auto const rows = support::readTable("tests/libobd/value/scalings_metric.txt");
    ASSERT_EQ(rows.size(), 109U);
    ASSERT_EQ(metricScalings().size(), rows.size());
    for (std::size_t i = 0; i < rows.size(); ++i) {
        expectRow(rows[i], metricScalings()[i]);
        EXPECT_EQ(metricScalings()[i].conversion, nullptr);
    }
}

TEST(UnitScalingTables, ImperialScalingsAgreeRowByRow)
{
    auto const rows = support::readTable("tests/libobd/value/scalings_imperial.txt");
    ASSERT_EQ(rows.size(), 30U);
    ASSERT_EQ(imperialScalings().size(), rows.size());
    for (std::size_t i = 0; i < rows.size(); ++i) {
        ScalingRow const& scaling = imperialScalings()[i];
        expectRow(rows[i], scaling);
        double const factor = std::stod(rows[i].at(4));
        double const offset = rows[i].at(4) == "1.8 + 32" ? 32.0 : 0.0;
        for (double const value : {0.0, 1.0, -7.25, 65535.0}) {
            double const converted = scaling.conversion != nullptr ? scaling.conversion(value) : value;
            EXPECT_EQ(converted, value * factor + offset) << rows[i].at(0);
        }
    }
}

// Every identifier through the factory: its value by the table's factor, its unit by the unit system.
TEST(UnitScalingFactory, MakesEveryRowOfBothTables)
{
    for (ScalingRow const& row : metricScalings()) {
        if (row.id == 0x2E || row.id == 0x16 || row.id == 0x39) {
            continue; // not linear through 0; each has its own test
        }
        auto const scaling = createForCan(row.id, UnitSystem::Metric);
        ASSERT_NE(scaling, nullptr);
        EXPECT_EQ(scaling->unit(), row.unit);
        EXPECT_EQ(scaling->value(1), row.factor);
        EXPECT_EQ(scaling->value(0xFFFF), row.id >= 0x80 ? -row.factor : 65535 * row.factor);
    }
    for (ScalingRow const& row : imperialScalings()) {
        auto const scaling = createForCan(row.id, UnitSystem::Imperial);
        ASSERT_NE(scaling, nullptr);
        EXPECT_EQ(scaling->unit(), row.unit);
    }
}

TEST(UnitScalingFactory, ImperialFallsBackToMetric)
{
    auto const volts = createForCan(0x0A, UnitSystem::Imperial);
    ASSERT_NE(volts, nullptr);
    EXPECT_EQ(volts->unit(), UnitVolt);
    EXPECT_EQ(shown(*volts, 0x0636), "0.194092");
}

TEST(UnitScalingFactory, Id16WithRaw0ReadsMinus40InBothSystems)
{
    auto const metric = createForCan(0x16, UnitSystem::Metric);
    EXPECT_EQ(metric->value(0), -40.0);
    EXPECT_EQ(shown(*metric, 0), "-40.0");
    EXPECT_EQ(metric->unit(), UnitCelsius);
    auto const imperial = createForCan(0x16, UnitSystem::Imperial);
    EXPECT_EQ(imperial->value(0), -40.0) << "the value stays metric, only the text is converted";
    EXPECT_EQ(shown(*imperial, 0), "-40.0");
    EXPECT_EQ(shown(*imperial, 1400), "212.0");
    EXPECT_EQ(imperial->unit(), UnitFahrenheit);
}

TEST(UnitScalingFactory, Id39ReadsPercentAroundZero)
{
    auto const scaling = createForCan(0x39, UnitSystem::Metric);
    EXPECT_EQ(shown(*scaling, 0x8000), "0.00");
    EXPECT_EQ(shown(*scaling, 0), "-327.68");
    EXPECT_EQ(shown(*scaling, 0xFFFF), "327.67");
    EXPECT_EQ(scaling->unit(), UnitPercent);
}

TEST(UnitScalingFactory, Id2EReadsAState)
{
    auto const scaling = createForCan(0x2E, UnitSystem::Imperial);
    EXPECT_EQ(shown(*scaling, 0x0001), "true");
    EXPECT_EQ(shown(*scaling, 0x8000), "true");
    EXPECT_EQ(shown(*scaling, 0), "false");
    EXPECT_EQ(scaling->unit(), UnitNone);
}

TEST(UnitScalingFactory, IdsFrom80AreSigned)
{
    EXPECT_EQ(createForCan(0x81, UnitSystem::Metric)->value(0xFFFF), -1.0);
    EXPECT_EQ(createForCan(0x01, UnitSystem::Metric)->value(0xFFFF), 65535.0);
    EXPECT_EQ(shown(*createForCan(0x81, UnitSystem::Metric), 0xFFFF), "-1");
    EXPECT_EQ(shown(*createForCan(0x82, UnitSystem::Metric), 0x8000), "-3276.8");
    EXPECT_EQ(shown(*createForCan(0xFC, UnitSystem::Metric), 0xFA4D), "-14.59");
}

TEST(UnitScalingFactory, ImperialTextsAreConverted)
{
    EXPECT_EQ(shown(*createForCan(0x09, UnitSystem::Imperial), 100), "62");     // km/h
    EXPECT_EQ(shown(*createForCan(0x1A, UnitSystem::Imperial), 100), "14.5");   // kPa
    EXPECT_EQ(shown(*createForCan(0x38, UnitSystem::Imperial), 1000), "2.20");  // g
    EXPECT_EQ(shown(*createForCan(0x92, UnitSystem::Imperial), 1000), "73.76"); // Nm
    EXPECT_EQ(shown(*createForCan(0x42, UnitSystem::Imperial), 1000), "94.8");  // kJ
    EXPECT_EQ(shown(*createForCan(0x97, UnitSystem::Imperial), 1000), "18.00"); // K
    EXPECT_EQ(shown(*createForCan(0xFE, UnitSystem::Imperial), 4000), "4.015"); // 1 kPa
    EXPECT_EQ(shown(*createForCan(0xFE, UnitSystem::Imperial), 0xF060), "-4.015");
    EXPECT_EQ(shown(*createForCan(0x32, UnitSystem::Imperial), 32787), "1.000"); // 1 inch
}

TEST(UnitScalingFactory, UnknownIdsGiveNoScalingAndALogLine)
{
    int known = 0;
    for (int id = 0; id < 256; ++id) {
        support::LogCapture log;
        bool const made = createForCan(static_cast<unsigned char>(id), UnitSystem::Metric) != nullptr;
        EXPECT_EQ(createForCan(static_cast<unsigned char>(id), UnitSystem::Imperial) != nullptr, made);
        std::vector<std::string> const told(made ? 0U : 2U, "ERROR Invalid scaling ID: " + std::to_string(id));
        EXPECT_EQ(log.lines(), told);
        known += made ? 1 : 0;
    }
    EXPECT_EQ(known, 109);
    support::LogCapture log;
    EXPECT_EQ(createForCan(0x01, static_cast<UnitSystem>(2)), nullptr);
    EXPECT_EQ(log.lines(), std::vector<std::string>{"ERROR Invalid scaling ID: 1"});
}

// The raw words whose texts stand in the files of texts: both ends, the ends of the signed range, and one between.
constexpr unsigned int writtenWords[] = {0x0000, 0x0001, 0x3039, 0x7FFF, 0x8000, 0xCFC7, 0xFFFF};

void expectTexts(Cells const& row, IUnitScaling const* scaling)
{
    ASSERT_NE(scaling, nullptr) << row.at(0);
    ASSERT_EQ(row.size(), std::size(writtenWords) + 1) << row.at(0);
    for (std::size_t i = 0; i < std::size(writtenWords); ++i) {
        EXPECT_EQ(shown(*scaling, writtenWords[i]), row[i + 1]) << row.at(0) << " of " << writtenWords[i];
    }
}

TEST(UnitScalingFactory, EveryMetricScalingShowsTheWrittenTexts)
{
    auto const rows = support::readTable("tests/libobd/value/scaledtexts_metric.txt");
    ASSERT_EQ(rows.size(), 109U);
    for (Cells const& row : rows) {
        expectTexts(row, createForCan(static_cast<unsigned char>(hex(row.at(0))), UnitSystem::Metric).get());
    }
}

TEST(UnitScalingFactory, EveryImperialScalingShowsTheWrittenTexts)
{
    auto const rows = support::readTable("tests/libobd/value/scaledtexts_imperial.txt");
    ASSERT_EQ(rows.size(), 30U);
    for (Cells const& row : rows) {
        expectTexts(row, createForCan(static_cast<unsigned char>(hex(row.at(0))), UnitSystem::Imperial).get());
    }
}

struct TestScaling
{
    float factor;
    Cells row;
};

// The identifiers of a cell such as "01-04, 07".
std::vector<unsigned char> identifiersIn(std::string const& cell)
{
    std::vector<unsigned char> ids;
    std::istringstream ranges(cell);
    for (std::string range; std::getline(ranges, range, ',');) {
        std::size_t const dash = range.find('-');
        unsigned int const first = hex(range.substr(0, dash));
        unsigned int const last = dash == std::string::npos ? first : hex(range.substr(dash + 1));
        for (unsigned int id = first; id <= last; ++id) {
            ids.push_back(static_cast<unsigned char>(id));
        }
    }
    return ids;
}

// The written table by test identifier.
std::map<unsigned int, TestScaling> writtenTestScalings()
{
    std::map<unsigned int, TestScaling> scalings;
    for (Cells const& row : support::readTable("tests/libobd/value/scalings_tests.txt")) {
        for (unsigned char const id : identifiersIn(row.at(0))) {
            scalings[id] = {std::stof(row.at(1)), row};
        }
    }
    return scalings;
}

TEST(UnitScalingFactory, TestScalingsAgreeForEveryTest)
{
    auto const written = writtenTestScalings();
    ASSERT_EQ(written.size(), 103U);
    for (unsigned int id = 0; id < 256; ++id) {
        auto const scaling = createForTest(static_cast<unsigned char>(id));
        ASSERT_NE(scaling, nullptr);
        auto const found = written.find(id);
        if (found == written.end()) {
            EXPECT_EQ(shown(*scaling, 0xFFFF), "65535") << id;
            EXPECT_EQ(scaling->unit(), UnitNone) << id;
            continue;
        }
        EXPECT_EQ(scaling->value(1), static_cast<double>(found->second.factor)) << id;
        EXPECT_EQ(scaling->value(0xFFFF), 65535 * static_cast<double>(found->second.factor)) << id;
        EXPECT_EQ(scaling->unit(), std::stoi(found->second.row.at(3))) << id;
        int const decimals = std::stoi(found->second.row.at(2));
        EXPECT_EQ(scaling->toString(0.0),
                  decimals == 0 ? "0" : "0." + std::string(static_cast<std::size_t>(decimals), '0'));
    }
}

TEST(UnitScalingFactory, EveryTestScalingShowsTheWrittenTexts)
{
    std::size_t tests = 0;
    for (Cells const& row : support::readTable("tests/libobd/value/scaledtexts_tests.txt")) {
        for (unsigned char const id : identifiersIn(row.at(0))) {
            expectTexts(row, createForTest(id).get());
            ++tests;
        }
    }
    EXPECT_EQ(tests, 103U);
}

TEST(UnitScalingFactory, Test30ReadsSecondsAndTest20AsItCame)
{
    EXPECT_EQ(shown(*createForTest(0x30), 25), "1.00");
    EXPECT_EQ(createForTest(0x30)->unit(), UnitSecond);
    EXPECT_EQ(shown(*createForTest(0x20), 25), "25");
    EXPECT_EQ(createForTest(0x20)->unit(), UnitNone);
}

} // namespace
