#include "libobd/parameters/monitortesttexts.h"
#include "tests/support/tablefile.h"

#include <gtest/gtest.h>

#include <map>

namespace {

using namespace obd;

std::map<unsigned int, std::vector<std::string>> tableById(std::string const& path)
{
    std::map<unsigned int, std::vector<std::string>> rows;
    for (auto const& row : support::readTable(path)) {
        rows[static_cast<unsigned int>(std::stoul(row.at(0), nullptr, 16))] = row;
    }
    return rows;
}

TEST(MonitorTestTexts, MonitorsAgreeRowByRow)
{
    auto const rows = tableById("tests/libobd/parameters/monitors.txt");
    ASSERT_EQ(rows.size(), 103U);
    for (unsigned int id = 0; id < 0xE1; ++id) {
        auto const found = rows.find(id);
        EXPECT_EQ(canMonitorDescription(static_cast<unsigned char>(id)),
                  found != rows.end() ? found->second.at(1) : "ISO/SAE reserved");
    }
}

TEST(MonitorTestTexts, MonitorsFromE1AreTheManufacturers)
{
    EXPECT_EQ(canMonitorDescription(0xE1), "Vehicle manufacturer defined monitor E1");
    EXPECT_EQ(canMonitorDescription(0xFF), "Vehicle manufacturer defined monitor FF");
    EXPECT_EQ(canMonitorDescription(0xE0), "OBD Monitor IDs supported ($E1 - $FF)");
}

TEST(MonitorTestTexts, EvapTextsKeepTheirTypographicQuotes)
{
    EXPECT_EQ(canMonitorDescription(0x39), "EVAP Monitor (Cap Off / 0.150\xE2\x80\x9D)");
    EXPECT_EQ(canMonitorDescription(0x3A), "EVAP Monitor (0.090\xE2\x80\x9C)");
}

TEST(MonitorTestTexts, ComponentsAreWrittenWithTwoDigits)
{
    EXPECT_EQ(saeMonitorDescription(0x03), "Manufacturer specified component 03");
    EXPECT_EQ(saeMonitorDescription(0x7A), "Manufacturer specified component 7A");
}

TEST(MonitorTestTexts, TestsAgreeForEveryIdentifier)
{
    auto const rows = tableById("tests/libobd/parameters/monitortests.txt");
    ASSERT_EQ(rows.size(), 14U);
    for (unsigned int id = 0; id < 256; ++id) {
        auto const tid = static_cast<unsigned char>(id);
        auto const found = rows.find(id);
        if (found != rows.end()) {
            EXPECT_EQ(canTestDescription(tid), found->second.at(1)) << id;
            EXPECT_EQ(saeTestDescription(tid), found->second.at(2)) << id;
            continue;
        }
        EXPECT_EQ(canTestDescription(tid), id < 0x80 ? "NA" : "Manufacturer Defined Test") << id;
        EXPECT_EQ(saeTestDescription(tid), id < 0x20    ? "ISO/SAE reserved"
                                           : id == 0x20 ? "NA"
                                                        : "Manufacturer Defined Test")
            << id;
    }
}

} // namespace
