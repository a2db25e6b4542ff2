#include "tests/support/tablefile.h"

#include <obd/vehiclemodelyear.h>

#include <gtest/gtest.h>

namespace {

using obd::GetVehicleModelYear;

std::string vinOf(char year)
{
    return std::string("WVWZZZ1KZ") + year + "W000000";
}

TEST(GetVehicleModelYear, TableAgreesRowByRow)
{
    auto const rows = support::readTable("tests/libobd/parameters/modelyears.txt");
    ASSERT_EQ(rows.size(), 30U);
    for (auto const& row : rows) {
        EXPECT_EQ(GetVehicleModelYear(vinOf(row.at(0).at(0))), std::stoi(row.at(1))) << row.at(0);
    }
}

TEST(GetVehicleModelYear, OtherCharactersStandForNoYear)
{
    int known = 0;
    for (int character = 0; character < 256; ++character) {
        known += GetVehicleModelYear(vinOf(static_cast<char>(character))) != 0 ? 1 : 0;
    }
    EXPECT_EQ(known, 30);
    EXPECT_EQ(GetVehicleModelYear(vinOf('Z')), 0);
    EXPECT_EQ(GetVehicleModelYear(vinOf('I')), 0);
}

TEST(GetVehicleModelYear, OtherLengthsHaveNoYear)
{
    EXPECT_EQ(GetVehicleModelYear("WVWZZZ1KZAW00000"), 0);
    EXPECT_EQ(GetVehicleModelYear("WVWZZZ1KZAW0000000"), 0);
    EXPECT_EQ(GetVehicleModelYear(""), 0);
}

} // namespace
