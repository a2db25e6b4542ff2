// Reports as plain text: how wide they are, numbers of vehicles, and scans that were kept.
#include "libvelmora/report/clearreport.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/plain/vintext.h"
#include "libvelmora/report/unitlabel.h"
#include "libvelmora/report/vinreport.h"
#include "tests/libvelmora/report/carbuilder.h"

#include <obd/parameteridentifier.h>
#include <velmora/history.h>

#include <gtest/gtest.h>

#include <sstream>

namespace {

using namespace velmora;
using namespace testsupport;

// How many lines a text takes that has two words of together so many characters.
std::size_t linesOf(std::string const& text)
{
    return static_cast<std::size_t>(std::count(text.begin(), text.end(), '\n'));
}

std::string twoWords(std::size_t length)
{
    return std::string(length - 6, 'x') + " " + std::string(5, 'y');
}

TEST(PlainText, FoldsLongTextsAtItsWidth)
{
    Finding const finding{Severity::Note, "m", "w", "t", "k", {{DataTopic::Codes, 1, twoWords(76)}}, {twoWords(77)}};
    EXPECT_EQ(toText({finding}, Style()), "Findings\n  none in what the vehicle told\n\nWhat the data suggests\n"
                                          "  m  w\n    t\n    because\n    - " +
                                              twoWords(76) + "\n    it may also be\n    - " + std::string(71, 'x') +
                                              "\n      yyyyy\n");
    auto const missing = [](std::size_t length) {
        ReadinessReport const report{
            TopicAnswer::Read,
            {},
            {{"A", ReadinessStatus::Complete, {}},
             {twoWords(length - std::string("Not available: ").size()), ReadinessStatus::NotAvailable, {}}}};
        return linesOf(toText(report, Style()));
    };
    EXPECT_EQ(missing(76) + 1, missing(77));
    auto const described = [](std::size_t length) {
        return linesOf(toText(RoutinesReport{TopicAnswer::Read, {{1, "A", twoWords(length)}}}, Style()));
    };
    EXPECT_EQ(described(72), 2U);
    EXPECT_EQ(described(73), 3U);
}

TEST(PlainText, HasNoColumnsOfTestsOnANarrowLine)
{
    MonitorsReport const report{TopicAnswer::Read,
                                {{1, "M", {{0x81, "D", "", "", "", "V", LimitTest::Verdict::Passed}}}}};
    auto const isTable = [&report](std::size_t columns) {
        return toText(report, Style(false, false, columns)).find("Minimum") != std::string::npos;
    };
    EXPECT_TRUE(isTable(0)) << "as wide as it likes";
    EXPECT_FALSE(isTable(1));
    EXPECT_FALSE(isTable(71));
    EXPECT_TRUE(isTable(72));
    EXPECT_EQ(toText(report, Style(false, false, 40)),
              "  Monitor tests  1 passed\n    01 M\n      passed  81: - V (- to -)\n        D\n");
}

TEST(PlainText, TellsWhatANumberOfAVehicleSays)
{
    EXPECT_EQ(toText(decodeVin("1M8GDM9A1KP042788", 2026), Style(true)),
              "  VIN            1M8GDM9A1KP042788\n"
              "  Region         North America\n"
              "  Country        United States\n"
              "  Maker          -\n"
              "  Model year     1989 (position 10 is K, position 7 says which cycle of 30 years)\n"
              "  Check digit    \033[31mwrong: X would fit; mistyped or altered\033[0m\n"
              "  Trouble codes  -\n");
    std::string const german = toText(decodeVin("WVWZZZ1JZXW000001", 2026), Style());
    EXPECT_NE(german.find("  Model year     1999, if this maker codes it (position 10 is X)\n"
                          "  Check digit    not used by this maker or market\n"
                          "  Trouble codes  Volkswagen's meanings, used by default\n"),
              std::string::npos)
        << german;
    EXPECT_NE(
        toText(decodeVin("WVXZZZ1JZ0W000001", 2026), Style()).find("  Model year     none coded in position 10 (0)\n"),
        std::string::npos);
    std::string const right = toText(decodeVin("1M8GDM9AXKP042788", 2026), Style(true));
    EXPECT_NE(right.find("  Check digit    \033[32mright\033[0m\n"), std::string::npos);
    VinFacts facts = decodeVin("WVWZZZ1JZXW000001", 2026);
    facts.basis = VinFacts::CodesBasis::Guess;
    EXPECT_NE(toText(facts, Style()).find("perhaps Volkswagen's meanings: --make \"Volkswagen\"\n"), std::string::npos);
    facts.basis = VinFacts::CodesBasis::None;
    EXPECT_NE(toText(facts, Style()).find("no list for this maker\n"), std::string::npos);
    EXPECT_EQ(toJsonValue(decodeVin("TMBZZZ1Z000000001", 2026))["modelYearBy"], Json(nullptr));
}

KeptScan keptScan(std::int64_t number, std::optional<bool> lamp, std::vector<std::string> const& codes)
{
    ModuleReport module = soundModule();
    module.codes.lamp = lamp;
    module.codes.lists[0] = readCodes(CodeKind::Confirmed, codes);
    KeptScan scan = makeScan(vehicleOf({module}), "golf", {}, "9.9");
    scan.number = number;
    return scan;
}

TEST(PlainText, ListsScansWithLampAndCodes)
{
    std::istringstream lines(
        toText({keptScan(9, std::nullopt, {}), keptScan(10, true, {"P0420", "P0300"}), keptScan(11, false, {})},
               TextStyle{true}));
    std::vector<std::string> rows;
    for (std::string line; std::getline(lines, line);) {
        std::size_t const time = line.find("19"); // of the local zone
        rows.push_back(time == std::string::npos ? line : line.substr(0, time) + line.substr(time + 19));
    }
    EXPECT_EQ(rows, (std::vector<std::string>{"golf", "   9    lamp -    no codes",
                                              "  10    \033[31mlamp on\033[0m   \033[31mP0420 P0300\033[0m",
                                              "  11    lamp off  no codes"}));
}

TEST(PlainText, TellsWhatChangedBetweenScans)
{
    KeptScan const older = keptScan(1, false, {});
    KeptScan const newer = keptScan(2, false, {});
    auto const told = [&](std::vector<Change> const& changes) {
        std::string const text = toText(older, newer, changes, TextStyle{true});
        std::size_t const title = text.find("Changes\n");
        EXPECT_EQ(text.substr(0, 14), "golf\n  scan 1 ");
        EXPECT_NE(text.find("\n  scan 2 of "), std::string::npos);
        return title == std::string::npos ? text : text.substr(title + 8);
    };
    EXPECT_EQ(told({}), "  \033[32mnothing that both scans told has changed\033[0m\n");
    EXPECT_EQ(told({{"a", ChangeWeight::Neutral, "M", "what", "name", "1", "2"},
                    {"b", ChangeWeight::Better, "M", "what", "", "1", "2"},
                    {"c", ChangeWeight::Worse, "M", "what", "name", "", ""},
                    {"d", ChangeWeight::Neutral, "M", "what", "", "", "2"},
                    {"e", ChangeWeight::Neutral, "", "what", "", "", ""}}),
              "          M  what  name: 1 -> 2\n"
              "  \033[32mbetter\033[0m  M  what  1 -> 2\n"
              "  \033[31mworse\033[0m   M  what  name\n"
              "          M  what   -> 2\n"
              "             what\n");
}

TEST(PlainText, PutsKmBesideHowLongTheEngineRan)
{
    InfoReport report;
    report.withLamp.distance = InfoReport::Reading{"12", "km"};
    report.sinceCleared.runTime = InfoReport::Reading{"9", ""};
    report.calibrations = {{"", "1791BC82"}};
    std::string const text = toText(report, Style());
    EXPECT_NE(text.find("  Calibration    -  verification 1791BC82\n"), std::string::npos);
    EXPECT_NE(text.find("  With lamp on   12 km\n  Since cleared  engine ran 9\n"), std::string::npos) << text;
}

TEST(ReportWords, OfClearsRunsAndAnswers)
{
    using enum ClearReport::Result;
    EXPECT_STREQ(resultWord(Cleared), "cleared");
    EXPECT_EQ(toJsonValue(ClearReport{Refused, "busy"}).dump(),
              R"({"cleared":false,"result":"refused","reason":"busy"})");
    EXPECT_EQ(toJsonValue(ClearReport{Cleared, ""}).dump(), R"({"cleared":true,"result":"cleared","reason":null})");
    EXPECT_EQ(toText(RoutineRun{{1, "A", ""}, RoutineRun::Result::NoAnswer, ""}, Style(true)),
              "  Routine 01     A\n  Result         \033[33mno answer\033[0m\n");
    EXPECT_STREQ(answerWord(TopicAnswer::Refused), "refused");
    EXPECT_STREQ(answerWord(TopicAnswer::Unreadable), "unreadable");
}

TEST(ReportWords, OfUnitsWithDegreesForTimings)
{
    auto const label = [](int pid, MeasurementUnit unit) { return std::string(unitLabel(pid * 10, unit)); };
    EXPECT_EQ(label(0x0E, UnitNone), "\u00B0");
    EXPECT_EQ(label(0x5D, UnitNone), "\u00B0");
    EXPECT_EQ(label(0x0C, UnitNone), "");
    EXPECT_EQ(label(0x0E, UnitPercent), "%");
}

} // namespace
