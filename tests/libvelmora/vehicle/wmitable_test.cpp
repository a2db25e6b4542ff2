#include "libvelmora/read/catalogueselection.h"
#include "libvelmora/vehicle/pidtitles.h"
#include "libvelmora/vehicle/wmitable.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using namespace velmora;

// All identifiers there can be.
template <typename Visit>
void forEachRow(Visit visit)
{
    std::string const characters = "0123456789ABCDEFGHJKLMNPRSTUVWXYZ";
    for (char const first : characters) {
        for (char const second : characters) {
            for (char const third : characters) {
                if (WmiRow const* const row = findWmi(std::string{first, second, third})) {
                    visit(std::string{first, second, third}, *row);
                }
            }
        }
    }
}

TEST(WmiTable, NamesOnlyListsThatTheCatalogueHas)
{
    forEachRow([](std::string const& wmi, WmiRow const& row) {
        EXPECT_EQ(row.codes.empty(), row.basis == WmiRow::Basis::None) << wmi;
        if (!row.codes.empty()) {
            EXPECT_EQ(findMaker(std::string(row.codes)), row.codes) << wmi;
        }
        EXPECT_NE(row.codes, "Oldsmobile") << wmi;
        EXPECT_FALSE(regionOfWmi(wmi).empty() && row.maker != "Mercedes-Benz") << wmi;
    });
}

TEST(WmiTable, TakesTheLongestRowAndNoneOfSmallMakers)
{
    EXPECT_EQ(findWmi("JHM")->standing, WmiRow::Standing::Listed);
    EXPECT_EQ(findWmi("JHZ")->wmi, "JH");
    EXPECT_EQ(findWmi("JHZ")->basis, WmiRow::Basis::Guess);
    EXPECT_EQ(findWmi("JH9"), nullptr);
    EXPECT_EQ(findWmi("00A"), nullptr);
    EXPECT_EQ(findWmi("JH"), nullptr);
    EXPECT_EQ(countryOfWmi("WZZ"), "Germany");
    EXPECT_EQ(countryOfWmi("VF9"), "France") << "of its neighbours";
    EXPECT_EQ(countryOfWmi("00A"), "");
    EXPECT_EQ(countryOfWmi("V"), "");
}

TEST(WmiTable, TellsTheRegionByTheFirstCharacter)
{
    std::string const characters = "0123456789ABCDEFGHIJKLMNOPQRSTUVWXYZ";
    std::string regions;
    for (char const first : characters) {
        regions += regionOfWmi(std::string(1, first)).substr(0, 2);
        regions += ",";
    }
    EXPECT_EQ(regions,
              ",No,No,No,No,No,Oc,No,So,So,Af,Af,Af,,,,,As,,As,As,As,As,As,As,As,As,As,Eu,Eu,Eu,Eu,Eu,Eu,Eu,Eu,");
    EXPECT_EQ(regionOfWmi(""), "");
    EXPECT_EQ(countryOfWmi("WV"), "Germany");
    EXPECT_EQ(countryOfWmi("4A"), "United States");
    EXPECT_EQ(countryOfWmi("LZ"), "China");
}

TEST(PidTitles, NameWhatTheStandardNamesAndNumberTheRest)
{
    EXPECT_EQ(pidTitle(0xA6), "Odometer");
    EXPECT_EQ(pidTitle(0x81), "AECD 1 to 5 Run Times");
    EXPECT_EQ(pidTitle(0xD3), "Engine Odometer");
    EXPECT_EQ(pidTitle(0xC2), "PID C2");
    EXPECT_EQ(pidTitle(0xFF), "PID FF");
}

} // namespace
