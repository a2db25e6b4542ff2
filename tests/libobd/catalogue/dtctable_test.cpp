#include "libobd/catalogue/dtctable.h"
#include "tools/catalogue/makers.h"

#include <obd/manufacturer.h>

#include <algorithm>
#include <array>
#include <cctype>
#include <fstream>
#include <iterator>
#include <map>
#include <set>
#include <sstream>
#include <string_view>
#include <utility>

namespace {

using obd::DtcRow;
using obd::DtcTable;

// How the rows of one maker or one prefix are counted in the manifest.
struct Count
{
    std::size_t target = 0; // the full shape of the table
    std::size_t rows = 0;   // whose meaning is known
};

// "kind<TAB>name<TAB>target<TAB>rows" by kind and name; lines that begin with '#' are remarks.
std::map<std::pair<std::string, std::string>, Count> readManifest()
{
    std::map<std::pair<std::string, std::string>, Count> counts;
    std::ifstream input(VELMORA_SOURCE_DIR "/tests/libobd/catalogue/manifest.txt");
    for (std::string line; std::getline(input, line);) {
        if (line.empty() || line.front() == '#') {
            continue;
        }
        std::istringstream fields(line);
        std::string kind;
        std::string name;
        std::getline(fields, kind, '\t');
        std::getline(fields, name, '\t');
        Count& count = counts[{kind, name}];
        fields >> count.target >> count.rows;
        EXPECT_FALSE(fields.fail()) << line;
    }
    return counts;
}

std::map<std::pair<std::string, std::string>, std::size_t> countRows()
{
    std::map<std::pair<std::string, std::string>, std::size_t> counts;
    std::set<std::string_view> codes;
    std::set<std::string_view> texts;
    for (DtcRow const& row : DtcTable()) {
        ++counts[{"maker", std::string(catalogue::makerName(static_cast<std::size_t>(row.maker)))}];
        ++counts[{row.maker == 0 ? "generic" : "makers", std::string(row.code, 2)}];
        codes.insert(row.code);
        texts.insert(row.text);
    }
    counts[{"all", "rows"}] = DtcTable::size();
    counts[{"all", "codes"}] = codes.size();
    counts[{"all", "texts"}] = texts.size();
    return counts;
}

// The texts of one maker's code, in table order.
std::vector<std::string> textsOf(std::string_view maker, std::string_view code)
{
    std::vector<std::string> texts;
    for (DtcRow const& row : DtcTable()) {
        if (catalogue::makerName(static_cast<std::size_t>(row.maker)) == maker && row.code == code) {
            texts.emplace_back(row.text);
        }
    }
    return texts;
}

bool isWellFormed(std::string_view code)
{
    return code.size() == 5 && std::string_view("PBCU").find(code[0]) != std::string_view::npos &&
           code.find_first_not_of("0123456789ABCDEF", 1) == std::string_view::npos;
}

TEST(DtcTable, CountsAreThoseOfTheManifest)
{
    auto const manifest = readManifest();
    auto counted = countRows();
    ASSERT_FALSE(manifest.empty());
    for (auto const& [key, count] : manifest) {
        EXPECT_EQ(counted[key], count.rows) << key.first << ' ' << key.second;
        counted.erase(key);
    }
    for (auto const& [key, rows] : counted) {
        ADD_FAILURE() << key.first << ' ' << key.second << " has " << rows << " rows and no line in the manifest";
    }
}

TEST(DtcTable, ManifestNamesEveryMaker)
{
    auto const manifest = readManifest();
    for (std::size_t maker = 0; maker < catalogue::makerCount(); ++maker) {
        EXPECT_EQ(manifest.count({"maker", std::string(catalogue::makerName(maker))}), 1U)
            << catalogue::makerName(maker);
    }
}

TEST(DtcTable, ShapeIsTheWholeOfEighteenThousandRows)
{
    std::size_t target = 0;
    for (auto const& [key, count] : readManifest()) {
        target += key.first == "maker" ? count.target : 0;
    }
    EXPECT_EQ(target, 18201U);
}

TEST(DtcTable, MakersRiseAndCodesRiseWithin)
{
    DtcRow previous = DtcTable::row(0);
    for (DtcRow const& row : DtcTable()) {
        ASSERT_LE(previous.maker, row.maker);
        if (previous.maker == row.maker) {
            ASSERT_LE(std::string_view(previous.code), std::string_view(row.code));
        }
        previous = row;
    }
}

TEST(DtcTable, GenericCodesStandOnce)
{
    std::set<std::string_view> codes;
    for (DtcRow const& row : DtcTable()) {
        if (row.maker == 0) {
            EXPECT_TRUE(codes.insert(row.code).second) << row.code;
        }
    }
}

TEST(DtcTable, TextsArePrintableAndOfTheRightLength)
{
    for (DtcRow const& row : DtcTable()) {
        std::string_view const text = row.text;
        EXPECT_TRUE(!text.empty() && text.size() <= 140) << row.code;
        EXPECT_TRUE(std::all_of(text.begin(), text.end(), [](char c) { return c >= ' ' && c <= '~'; })) << text;
        EXPECT_EQ(text.find_first_of("()[]{}#\""), std::string_view::npos) << row.code << ' ' << text;
        EXPECT_EQ(text.find("  "), std::string_view::npos) << text;
        EXPECT_TRUE(text.front() != ' ' && text.back() != ' ') << text;
    }
}

TEST(DtcTable, EachTextIsStoredOnce)
{
    std::map<std::string_view, char const*> places;
    for (DtcRow const& row : DtcTable()) {
        auto const place = places.emplace(row.text, row.text).first->second;
        EXPECT_EQ(place, row.text) << row.text;
    }
}

// Letters and digits alone, in small letters, with a blank for what stands between words.
std::string bareWords(std::string_view text)
{
    std::string words;
    for (char const c : text) {
        if (std::isalnum(static_cast<unsigned char>(c)) != 0) {
            words += static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
        } else if (!words.empty() && words.back() != ' ') {
            words += ' ';
        }
    }
    return words;
}

TEST(DtcTable, NoTwoTextsDifferOnlyInCaseOrPunctuation)
{
    // A slash stands for "or": the second is another condition than that of the code list. The first is as given.
    std::set<std::string_view> const apart = {"Lost Communication with TCM",
                                              "EVAP System Leak Detection Pump Control Circuit/Open"};
    std::map<std::string, std::string_view> firsts;
    for (DtcRow const& row : DtcTable()) {
        if (apart.count(row.text) == 0) {
            EXPECT_EQ(firsts.emplace(bareWords(row.text), row.text).first->second, row.text) << row.code;
        }
    }
}

TEST(DtcTable, ConditionsThatAreAlikeAreKeptApart)
{
    EXPECT_EQ(textsOf("GM", "P1133"), std::vector<std::string>{"O2 Sensor Insufficient Switching"});
    EXPECT_EQ(textsOf("GM", "P1134"), std::vector<std::string>{"O2 Sensor Transition Time Ratio"});
    EXPECT_EQ(textsOf("Isuzu", "P1640"), (std::vector<std::string>{"ODM 1 Circuit High - Except 1998 Rodeo",
                                                                   "ODM Output A Circuit - 1998 Rodeo"}));
    EXPECT_EQ(textsOf("Isuzu", "P1381"),
              (std::vector<std::string>{"Cylinder Position Sensor Intermittent - Misfire Detected - Except 1998 Rodeo",
                                        "ABS Rough Road Class 2 Serial Data or Link Error - 1998 Rodeo"}));
    EXPECT_EQ(textsOf("Mazda", "P1601"), std::vector<std::string>{"PCM Communication Line to TCM Error"});
    EXPECT_EQ(textsOf("Nissan", "P1336"), std::vector<std::string>{"Crankshaft Position Sensor"});
    EXPECT_EQ(textsOf("Infinity", "P1336"), std::vector<std::string>{"Crankshaft Position Sensor Cog Signal"});
    EXPECT_EQ(textsOf("Mazda", "P1602"), (std::vector<std::string>{"PCM Communication Line to TCM Error",
                                                                   "Immobilizer System Communication Error with PCM"}));
}

TEST(DtcTable, GenericSamplesWordForWord)
{
    std::pair<char const*, char const*> const samples[] = {
        {"B0001", "Driver Frontal Stage 1 Deployment Control"},
        {"C0035", "Right Front Wheel Speed Sensor Supply"},
        {"P0105", "Manifold Absolute Pressure/Barometric Pressure Sensor Circuit"},
        {"P0300", "Random/Multiple Cylinder Misfire Detected"},
        {"P0420", "Catalyst System Efficiency Below Threshold Bank 1"},
        {"P0A0F", "Engine Failed to Start"},
        {"U0101", "Lost Communication with TCM"},
        {"U350C", "Control Module Cooling Fan Circuit/Open"},
    };
    for (auto const& [code, text] : samples) {
        EXPECT_EQ(textsOf("Generic", code), std::vector<std::string>{text});
    }
}

TEST(DtcTable, MakersSamplesWordForWord)
{
    std::array<char const*, 3> const samples[] = {
        {"Buick", "P1300]", "Ignitor Circuit"},
        {"Chrysler", "P1000", "Cooling System Heat Valve Control Circuit"},
        {"Dodge", "P1000", "Cooling System Heat Valve Control Circuit"},
        {"Ford", "P1000", "OBD-II Monitor Testing Incomplete"},
        {"Jaguar", "P1000", "OBD Systems Readiness Test Not Complete"},
        {"Jeep", "P1000", "Cooling System Heat Valve Control Circuit"},
        {"Land Rover", "P1000", "Engine Control Module Memory Erased"},
        {"Land Rover", "P15O9", "Idle Speed Control Circuit Shorted"},
        {"Volvo", "P1770", "CMP Sensor Intake/Exhaust Signal Error"},
    };
    for (auto const& [maker, code, text] : samples) {
        EXPECT_EQ(textsOf(maker, code), std::vector<std::string>{text}) << maker << ' ' << code;
    }
}

TEST(DtcTable, MisspelledSampleIsKept)
{
    EXPECT_EQ(textsOf("Alfa Romeo", "P1213"),
              (std::vector<std::string>{"Full Throttle Swithc Or Circuit", "Full Throttle Swithc Or Circuit"}));
}

TEST(DtcTable, RepeatedCodesStandTwoToFourTimes)
{
    std::map<std::pair<std::int32_t, std::string_view>, int> rows;
    for (DtcRow const& row : DtcTable()) {
        ++rows[{row.maker, row.code}];
    }
    std::map<std::string_view, int> repeated;
    for (auto const& [key, count] : rows) {
        EXPECT_LE(count, 4) << key.second;
        if (count > 1) {
            ++repeated["all"];
            ++repeated[catalogue::makerName(static_cast<std::size_t>(key.first))];
        }
    }
    EXPECT_EQ(repeated["all"], 141);
    EXPECT_EQ(repeated["Fiat"], 35);
    EXPECT_EQ(repeated["GM"], 17);
    EXPECT_EQ(repeated["Alfa Romeo"], 14);
    EXPECT_EQ(repeated["Generic"], 0);
}

TEST(DtcTable, MakersOfOnePlatformHaveTheSameRows)
{
    using Rows = std::vector<std::pair<std::string_view, std::string_view>>;
    std::map<std::string_view, Rows> rows;
    for (DtcRow const& row : DtcTable()) {
        rows[catalogue::makerName(static_cast<std::size_t>(row.maker))].emplace_back(row.code, row.text);
    }
    EXPECT_FALSE(rows["Chrysler"].empty() || rows["Citroen"].empty() || rows["Lincoln"].empty());
    EXPECT_EQ(rows["Chrysler"], rows["Dodge"]);
    EXPECT_EQ(rows["Chrysler"], rows["Jeep"]);
    EXPECT_EQ(rows["Citroen"], rows["Peugeot"]);
    EXPECT_EQ(rows["Lincoln"], rows["Mercury"]);
    EXPECT_EQ(rows["Lincoln"], rows["Oldsmobile"]);
    EXPECT_EQ(rows["Skoda"], rows["Volkswagen"]);
}

TEST(DtcTable, GenericRowsStayInTheControlledRanges)
{
    std::set<std::string> const generic = {"P0", "P2", "P3", "U0", "U3", "B0", "B3", "C0"};
    for (DtcRow const& row : DtcTable()) {
        if (row.maker == 0) {
            EXPECT_EQ(generic.count(std::string(row.code, 2)), 1U) << row.code;
        }
    }
}

TEST(DtcTable, AllCodesButTwoAreWellFormed)
{
    std::set<std::string> malformed;
    for (DtcRow const& row : DtcTable()) {
        if (!isWellFormed(row.code)) {
            malformed.emplace(row.code);
        }
    }
    EXPECT_EQ(malformed, (std::set<std::string>{"P1300]", "P15O9"}));
}

TEST(DtcTable, IteratorWalksAllRows)
{
    DtcTable const table;
    EXPECT_EQ(static_cast<std::size_t>(std::distance(table.begin(), table.end())), DtcTable::size());
    auto second = table.begin();
    EXPECT_EQ((*second++).code, DtcTable::row(0).code);
    EXPECT_EQ((*second).code, DtcTable::row(1).code);
}

// The tool that builds the table numbers the makers by a list of its own.
TEST(DtcTable, MakersAreNumberedAsTheLibraryNumbersThem)
{
    ASSERT_EQ(catalogue::makerCount(), obd::Manufacturer::Volvo + 1U);
    for (std::size_t maker = 0; maker < catalogue::makerCount(); ++maker) {
        EXPECT_EQ(obd::Manufacturer::manufacturerToString(static_cast<obd::Manufacturer::AutoManufacturer>(maker)),
                  catalogue::makerName(maker));
    }
}

} // namespace
