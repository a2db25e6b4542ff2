// Parts of a report as documents: the tiles at its head, the table of modules, and what is left out.
#include "libvelmora/report/document/moduletables.h"
#include "libvelmora/report/document/reportfile.h"
#include "libvelmora/report/document/reportsections.h"
#include "tests/libvelmora/report/carbuilder.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/document.h>
#include <velmora/error.h>

#include <gtest/gtest.h>

#include <ctime>

namespace {

using namespace velmora;
using namespace testsupport;

ReportFacts const partFacts = {"2026-05-01 10:00", "/dev/ttyUSB0", "9.9", false, 2026};

std::string markName(DocumentMark mark)
{
    static constexpr char const* names[] = {"", " good", " warning", " bad", " faint"};
    return names[static_cast<int>(mark)];
}

// "off good, 0 good, 0 good, 0, 1": lamp, codes, monitors, suggestions and modules.
std::string tilesOf(std::vector<ModuleReport> const& modules)
{
    VehicleReport const report = vehicleOf(modules);
    DocumentSection const section = vehicleSection(report, partFacts, findings(report));
    std::string text;
    for (auto const& [label, cell] : std::get<DocumentTiles>(section.blocks.at(0)).tiles) {
        text += (text.empty() ? "" : ", ") + cell.text + markName(cell.mark);
    }
    return text;
}

TEST(ReportTiles, TellTheVehicleAtAGlance)
{
    EXPECT_EQ(tilesOf({soundModule()}), "off good, 0 good, 0 good, 0, 1");
    EXPECT_EQ(tilesOf({}), "not reported faint, not reported faint, not reported faint, 0, 0");
    ModuleReport const untold{0x7E9, "", {}, {}, {}, {}, {}, {}, {}, {}};
    EXPECT_EQ(tilesOf({soundModule(), untold}), "off good, 0 good, 0 good, 0, 2") << "one told it";
    EXPECT_EQ(tilesOf({untold, soundModule()}), "off good, 0 good, 0 good, 0, 2");
    ModuleReport ill = soundModule();
    ill.codes.lamp = true;
    setIncomplete(ill, "Catalyst");
    EXPECT_EQ(tilesOf({soundModule(0x7E9), ill}), "on bad, 0 good, 1 warning, 1 warning, 2");
    ModuleReport coded = soundModule();
    coded.codes.lists[0] = readCodes(CodeKind::Confirmed, {"P0420", "P0300"});
    coded.codes.lists[2] = readCodes(CodeKind::Permanent, {"P0420"});
    EXPECT_EQ(tilesOf({coded}), "off good, 2 bad, 0 good, 0, 1") << "a code counts once";
    ModuleReport other = coded;
    other.id = 0x7E9;
    EXPECT_EQ(tilesOf({coded, other}), "off good, 4 bad, 0 good, 0, 2") << "in each module";
    coded.codes.lists[0] = {CodeKind::Confirmed, CodeList::Answer::Silent, {}, {}};
    EXPECT_EQ(tilesOf({coded}), "off good, 1 bad, 0 good, 0, 1");
    coded.codes.lists[2] = readCodes(CodeKind::Permanent, {});
    EXPECT_EQ(tilesOf({coded}), "off good, not reported faint, 0 good, 0, 1");
}

std::string factsOfVehicle(std::vector<ModuleReport> const& modules, ReportFacts const& facts)
{
    DocumentSection const section = vehicleSection(vehicleOf(modules), facts, {});
    std::string text;
    for (auto const& [label, cell] : std::get<DocumentFacts>(section.blocks.at(1)).rows) {
        text += label + " " + cell.text + "; ";
    }
    return text;
}

TEST(ReportTiles, StandOverWhatNamesTheVehicle)
{
    std::string const rest = "Date 2026-05-01 10:00; Adapter ELM327 v1.5; ";
    ModuleReport second = soundModule(0x7E9);
    second.info.vin = "WVWZZZ1JZXW000001";
    EXPECT_EQ(factsOfVehicle({soundModule(), second}, partFacts),
              "VIN WVWZZZ1JZXW000001; Maker Volkswagen; Model year 1999, if this maker codes it; " + rest);
    second.info.vin = "WVWZZZ1JZTW000001";
    EXPECT_EQ(factsOfVehicle({second}, partFacts),
              "VIN WVWZZZ1JZTW000001; Maker Volkswagen; Model year 1996 or 2026, if "
              "this maker codes it; " +
                  rest);
    second.info.vin = "short";
    EXPECT_EQ(factsOfVehicle({second}, partFacts), "VIN short; " + rest);
    EXPECT_EQ(factsOfVehicle({soundModule()}, partFacts), "VIN ; " + rest);
    ReportFacts named = partFacts;
    named.vehicle = "my van";
    EXPECT_EQ(factsOfVehicle({soundModule()}, named), "Name my van; " + rest);
    EXPECT_EQ(factsOfVehicle({second}, named), "VIN short; Name my van; " + rest);
}

std::vector<std::string> titlesOf(ModuleReport const& module)
{
    std::vector<std::string> titles;
    for (DocumentSection const& section : moduleSections(module, partFacts)) {
        titles.push_back(section.title + (section.anchor.empty() ? "" : " #" + section.anchor));
    }
    return titles;
}

TEST(ReportSections, LeaveOutWhatHoldsNothing)
{
    ModuleReport module = soundModule();
    std::vector<std::string> const always = {"Control module 7E8: ECM #info-7E8", "Trouble codes (7E8) #codes-7E8",
                                             "Readiness (7E8) #readiness-7E8"};
    EXPECT_EQ(titlesOf(module), always);
    module.monitors = {TopicAnswer::Read, {}};
    module.oxygen = {TopicAnswer::Read, true, true, {{obd::OxygenSensorLocation::Bank1Sensor1, {}}}};
    EXPECT_EQ(titlesOf(module), always) << "on CAN the sensors' tests are among those of the monitors";
    module.oxygen.answer = TopicAnswer::Silent;
    EXPECT_EQ(titlesOf(module), always);
    module.oxygen.onCan = false;
    EXPECT_EQ(titlesOf(module).back(), "Oxygen sensor tests (7E8) #oxygen-7E8");
}

TEST(ReportSections, PairTheCountersOfAMonitor)
{
    CountersReport const report{TopicAnswer::Read,
                                {{"EGR Monitor Completion Counts", 3},
                                 {"EGR Monitor Completion Counts", 4},
                                 {"EGR Monitor Conditions Encountered Counts", 8},
                                 {"NMHC Completion Condition Counts", 1},
                                 {"NOx Completion Conditions Counts", 2},
                                 {"OBD Monitoring Conditions Encountered Counts", 9}}};
    std::vector<DocumentBlock> const blocks = counterTables(report);
    ASSERT_EQ(blocks.size(), 2U);
    std::string text;
    for (auto const& block : blocks) {
        for (std::vector<DocumentCell> const& row : std::get<DocumentTable>(block).rows) {
            for (DocumentCell const& cell : row) {
                text += cell.text + "|";
            }
            text += "\n";
        }
    }
    EXPECT_EQ(text, "EGR Monitor|3|8|0.38|\nEGR Monitor|4|0||\nNMHC|1|0||\nNOx|2|0||\n"
                    "OBD Monitoring Conditions Encountered Counts|9|\n");
    EXPECT_EQ(std::get<DocumentParagraph>(counterTables({TopicAnswer::Read, {}}).at(0)).text.text,
              "All counters are 0.");
}

TEST(ReportSections, NameEachModuleWithItsCalibrations)
{
    ModuleReport first = soundModule();
    first.info.calibrations = {{"A", ""}, {"B", ""}};
    DocumentSection const section = modulesSection(vehicleOf({first, soundModule(0x7E9)}));
    DocumentTable const& table = std::get<DocumentTable>(section.blocks.at(0));
    ASSERT_EQ(table.rows.size(), 2U);
    EXPECT_EQ(table.rows[0][0].text, "7E8 ECM");
    EXPECT_EQ(table.rows[0][0].link, "info-7E8");
    EXPECT_EQ(table.rows[0][1].text, "off");
    EXPECT_EQ(table.rows[0][2].text, "0");
    EXPECT_EQ(table.rows[0][4].text, "1");
    EXPECT_EQ(table.rows[0][5].text, "A, B");
    for (std::size_t column = 0; column < 6; ++column) {
        EXPECT_EQ(table.rows[0][column].isNumber, column >= 2 && column <= 4) << column;
        EXPECT_EQ(table.heads[column].isNumber, column >= 2 && column <= 4) << column;
    }
}

TEST(MarkdownDocument, TakesControlCharactersForBlanks)
{
    ReportDocument document{"a\nb\tc", {{6, "t", {DocumentParagraph{{""}}, DocumentFacts{{{"l", {"x|y"}}}}}}}, "f"};
    EXPECT_EQ(toMarkdown(document), "# a b c\n\n####### t\n\n-\n\n| | |\n|---|---|\n| l | x\\|y |\n\n---\n\nf\n");
}

TEST(HtmlDocument, HasHeadingsOfFiveLevelsAndHeadsOfWideTables)
{
    DocumentTable const wide{{{"1"}, {"2"}, {"3"}, {"4"}, {"5"}}, {{{"a"}, {"b"}, {"c"}, {"d"}, {"e"}, {"f"}}}};
    DocumentTable const narrow{{{"1"}, {"2"}, {"3"}, {"4"}}, {{{"a"}}}};
    ReportDocument document{"t", {{0, "zero", {}, "a"}, {1, "one", {wide}}, {9, "nine", {narrow}, "b"}}, "f"};
    std::string const html = toHtml(document);
    EXPECT_NE(html.find("<section class=\"level2\" id=\"a\">\n<h2>zero</h2>"), std::string::npos);
    EXPECT_NE(html.find("<section class=\"level2\">\n<h2>one</h2>\n<table class=\"wide\">"), std::string::npos);
    EXPECT_NE(html.find("<section class=\"level6\" id=\"b\">\n<h6>nine</h6>\n<table>\n"), std::string::npos);
    EXPECT_NE(html.find("<td data-head=\"5\">e</td><td>f</td></tr>"), std::string::npos) << "a cell without a head";
    EXPECT_EQ(html.find("<nav"), std::string::npos);
    document.contents = "Contents";
    document.sections[1].anchor = "c";
    std::string const listed = toHtml(document);
    EXPECT_NE(listed.find("<nav aria-label=\"Contents\">\n<ul>\n<li><a href=\"#c\">one</a></li>\n</ul>\n</nav>"),
              std::string::npos)
        << "those of level 1 alone";
    document.sections[1].anchor.clear();
    EXPECT_NE(toHtml(document).find("<ul>\n</ul>"), std::string::npos) << "and only what has an anchor";
}

TEST(ReportFile, GoesByTheDayOnWhichItWasMade)
{
    std::tm day{};
    day.tm_year = 126;
    day.tm_mon = 5;
    day.tm_mday = 7;
    day.tm_hour = 8;
    day.tm_min = 9;
    day.tm_isdst = -1;
    DocumentOptions options;
    options.made = std::chrono::system_clock::from_time_t(std::mktime(&day));
    options.port = "/dev/ttyUSB3";
    options.vehicle = "my van";
    ModuleReport module = soundModule();
    module.info.vin = "WVWZZZ1JZWW000001"; // 1998, or 2028
    module.codes.lamp = true;
    TemporaryFolder const folder;
    for (char const* const name : {"car.md", "car.txt"}) {
        writeDocument(folder.file(name), vehicleOf({module}), options);
    }
    std::string const text = folder.read("car.md");
    EXPECT_NE(text.find("| Date | 2026-06-07 08:09 |"), std::string::npos) << text;
    EXPECT_NE(text.find("| Model year | 1998, if this maker codes it |"), std::string::npos) << "2028 is still to come";
    EXPECT_NE(text.find("| Port | /dev/ttyUSB3 |"), std::string::npos);
    EXPECT_NE(text.find("| Name | my van |"), std::string::npos);
    EXPECT_EQ(folder.read("car.txt").find('\x1B'), std::string::npos) << "a file has no colours";
    EXPECT_NE(toText(vehicleOf({module}), options, TextStyle{true}).find('\x1B'), std::string::npos);
}

TEST(ReportFile, IsReplacedOnlyWhereThatIsWanted)
{
    TemporaryFolder const folder;
    VehicleReport const report = vehicleOf({soundModule()});
    std::string const file = folder.file("car.txt");
    EXPECT_NO_THROW(checkDocument(file));
    writeDocument(file, report, {});
    std::string const before = folder.read("car.txt");
    EXPECT_THROW(writeDocument(file, vehicleOf({}), {}), Error) << "not unless it is said";
    EXPECT_THROW(checkDocument(file), Error);
    EXPECT_EQ(folder.read("car.txt"), before);
    writeDocument(file, vehicleOf({}), {}, true);
    EXPECT_LT(folder.read("car.txt").size(), before.size()) << "nothing is left behind the end";
    std::filesystem::create_directory(folder.path() / "folder.html");
    try {
        checkReportPath(folder.file("folder.html"), true);
        ADD_FAILURE() << "a folder can't be replaced";
    } catch (Error const& error) {
        EXPECT_EQ(error.kind(), ErrorKind::Failed);
    }
}

} // namespace
