// A report with all that modules may and may not tell, held against the page and the text that are kept beside this
// test. Who changes reports on purpose looks at both and keeps them anew: the test says where it wrote them.
#include "libvelmora/report/document/reportdocument.h"
#include "libvelmora/report/document/reportfile.h"
#include "libvelmora/report/document/vehiclereportjson.h"
#include "libvelmora/report/plain/reporttext.h"
#include "tests/libvelmora/report/carbuilder.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <sstream>

namespace {

using namespace velmora;
using namespace testsupport;

ModuleReport talkativeModule()
{
    ModuleReport module = soundModule();
    module.supported = {0x04, 0x05, 0x0C};
    module.info.vin = "1M8GDM9AXKP042788";
    module.info.description = "Engine Control Module";
    module.info.standard = "EOBD";
    module.info.protocol = "ISO 15765-4";
    module.info.engineSerialNumber = "4711";
    module.info.erotan = "EX1";
    module.info.withLamp = {InfoReport::Reading{"1", "km"}, InfoReport::Reading{"2", "min"}};
    module.info.sinceCleared = {InfoReport::Reading{"412", "km"}, InfoReport::Reading{"3", ""}};
    module.info.calibrations = {{"A", "1"}, {"B", ""}};
    module.codes.lamp = true;
    module.codes.lists[0] = readCodes(CodeKind::Confirmed, {"P0420", "P0300"});
    module.codes.lists[1] = readCodes(CodeKind::Pending, {"P0171"});
    module.codes.lists[2] = {CodeKind::Permanent, CodeList::Answer::Refused, "busy (21)", {}};
    applyMaker(module.codes, {MakerChoice::By::Vin, "Ford"});
    module.freeze = {0, TopicAnswer::Read,
                     FreezeFrame{troubleCode("P0420"), {{"Engine RPM", "1726", "rpm"}, {"Speed", std::nullopt, ""}}}};
    module.readiness.monitors = {{"Misfire", ReadinessStatus::Complete, ReadinessStatus::Complete},
                                 {"Catalyst", ReadinessStatus::NotComplete, ReadinessStatus::NotComplete},
                                 {"EGR", ReadinessStatus::NotAvailable, std::nullopt},
                                 {"Oxygen Sensor", ReadinessStatus::Complete, ReadinessStatus::DisabledThisCycle}};
    module.monitors = {TopicAnswer::Read,
                       {{0x01, "Sensor", {{0x80, "Passed", "2", "1", "3", "V", LimitTest::Verdict::Passed}}},
                        {0x21,
                         "Catalyst",
                         {{0x80, "No limits", "1", "", "", "V", LimitTest::Verdict::NoResult},
                          {0x81, "Too low", "1", "2", "3", "V", LimitTest::Verdict::Failed},
                          {0x82, "Only most", "4", "", "3", "V", LimitTest::Verdict::Failed},
                          {0x83, "Only least", "4", "3", "", "", LimitTest::Verdict::Passed}}}}};
    module.counters = {TopicAnswer::Read,
                       {{"Ignition Cycle Counter", 65535},
                        {"Catalyst Monitor Completion Counts Bank 1", 388},
                        {"Catalyst Monitor Conditions Encountered Counts Bank 1", 412},
                        {"EVAP Monitor Conditions Encountered Counts", 7},
                        {"EGR Monitor Completion Counts", 3}}};
    setValue(module, 0x05, {120.0, 121}, "121", "°C");
    setValue(module, 0x0C, {800}, "800", "rpm");
    setValue(module, 0x03, {}, "Open loop");
    return module;
}

VehicleReport wholeVehicle()
{
    ModuleReport oxygen = soundModule(0x11);
    oxygen.name = "";
    oxygen.codes.lamp = std::nullopt;
    oxygen.codes.lists[0] = {CodeKind::Confirmed, CodeList::Answer::Silent, {}, {}};
    oxygen.codes.lists[1] = {CodeKind::Pending, CodeList::Answer::Unreadable, {}, {}};
    applyMaker(oxygen.codes, {MakerChoice::By::Guess, "Opel"});
    oxygen.offers = TopicAnswer::Silent;
    oxygen.freeze = {2, TopicAnswer::Read, std::nullopt};
    oxygen.oxygen = {TopicAnswer::Read,
                     true,
                     false,
                     {{obd::OxygenSensorLocation::Bank4Sensor2,
                       {{0x01, "Rich to lean", "0.45", "", "", "V", LimitTest::Verdict::None},
                        {0x02, "Swing", "0.1", "0.2", "0.9", "V", LimitTest::Verdict::Failed}}}}};
    ModuleReport silent{0x18DAF110, "TCM <2>", {}, {}, {}, {}, {}, {}, {}, {}};
    silent.freeze.answer = TopicAnswer::Refused;
    silent.readiness.answer = TopicAnswer::Silent;
    silent.monitors.answer = TopicAnswer::Unreadable;
    silent.oxygen.answer = TopicAnswer::NotOffered;
    silent.counters.answer = TopicAnswer::Refused;
    applyMaker(silent.codes, {MakerChoice::By::Option, "VW"});
    VehicleReport report = vehicleOf({talkativeModule(), oxygen, silent});
    report.adapter = {"ELM327 v1.5", "OBDII to RS232", "ID-7", 12.34F};
    return report;
}

ReportFacts wholeFacts()
{
    ReportFacts facts{"2026-05-01 10:00", "/dev/ttyUSB0", "9.9", true, 2026};
    facts.inspection = {InspectionRule::UsEpa, 2010};
    facts.vehicle = "my van";
    return facts;
}

void expectAsKept(std::string const& text, std::string const& name)
{
    std::ostringstream kept;
    kept << std::ifstream(std::string(VELMORA_SOURCE_DIR) + "/tests/libvelmora/report/expected/" + name).rdbuf();
    if (kept.str() == text) {
        return;
    }
    std::string const made = (std::filesystem::temp_directory_path() / ("velmora-" + name)).string();
    std::ofstream(made) << text;
    auto const place = std::mismatch(text.begin(), text.end(), kept.str().begin(), kept.str().end()).first;
    std::size_t const at = static_cast<std::size_t>(place - text.begin());
    ADD_FAILURE() << name << " differs at ..." << text.substr(at - std::min<std::size_t>(at, 60), 160)
                  << "...\nit is in " << made;
}

TEST(WholeReport, IsThePageAndTheTextThatAreKept)
{
    ReportDocument const document = makeDocument(withShownVins(wholeVehicle(), wholeFacts()), wholeFacts());
    expectAsKept(toMarkdown(document), "whole.md");
    std::string const html = toHtml(document);
    std::size_t const style = html.find("<style");
    std::size_t const end = html.find("</style>");
    ASSERT_NE(end, std::string::npos);
    expectAsKept(html.substr(0, style) + html.substr(end), "whole.html");
}

TEST(WholeReport, IsTheTextOfATerminalThatIsKept)
{
    InspectionReport const inspection = inspect(wholeVehicle(), wholeFacts().inspection, wholeFacts().year);
    std::string text = toText(wholeVehicle(), Style(true, true, 0), inspection);
    for (std::size_t at = text.find('\x1B'); at != std::string::npos; at = text.find('\x1B', at)) {
        text[at] = '^'; // so that the file can be read
    }
    expectAsKept(text, "whole.txt");
    expectAsKept(toText(wholeVehicle(), Style(false, false, 60), std::nullopt), "narrow.txt");
}

// Vehicles that suggest each of the things that data may suggest, in each of its forms.
std::vector<VehicleReport> suggestiveVehicles()
{
    std::vector<VehicleReport> list;
    auto const driven = [](std::vector<std::pair<unsigned int, std::vector<double>>> const& values) {
        ModuleReport module = soundModule();
        setValue(module, 0x03, {}, "Closed loop (1)");
        for (auto const& [pid, samples] : values) {
            setValue(module, pid, samples, {}, "u");
        }
        return module;
    };
    for (auto const& values : std::vector<std::vector<std::pair<unsigned int, std::vector<double>>>>{
             {{0x05, {88, 89}}, {0x06, {15, 15}}, {0x07, {0, 0}}, {0x08, {-14, -14}}, {0x09, {0, 0}}},
             {{0x05, {88, 89}}, {0x06, {-15, -15}}, {0x07, {-15, -15}}, {0x08, {-14, -14}}, {0x09, {-1, -1}}},
             {{0x05, {60, 61}}, {0x1F, {900}}, {0x46, {20}}},
             {{0x05, {60, 61}}, {0x1F, {900}}},
             {{0x05, {116, 117}}},
             {{0x0C, {800, 790}}, {0x42, {12, 12}}},
             {{0x0C, {800, 790}}, {0x42, {16, 16}}},
             {{0x0C, {0, 0}}, {0x42, {11, 11}}},
             {{0x30, {3}}, {0x31, {12}}, {0x4E, {77}}}}) {
        list.push_back(vehicleOf({driven(values)}));
    }
    ModuleReport permanent = soundModule();
    permanent.codes.lists[2] = readCodes(CodeKind::Permanent, {"P0420", "P0300"});
    list.push_back(vehicleOf({permanent}));
    setValue(permanent, 0x30, {3});
    setValue(permanent, 0x31, {12}, {}, "km");
    list.push_back(vehicleOf({permanent}));
    ModuleReport lamp = soundModule();
    lamp.codes.lamp = true;
    lamp.info.vin = "1M8GDM9AXKP042788";
    lamp.info.calibrations = {{"A", "00000000"}, {"", ""}};
    ModuleReport other = soundModule(0x7E9);
    other.info.vin = "1G1JC5444R7252367";
    list.push_back(vehicleOf({lamp, other}));
    ModuleReport tests = soundModule();
    tests.monitors = {
        TopicAnswer::Read,
        {{0x21,
          "Catalyst Monitor Bank 1",
          {{0x80, "High", "0.97", "0.10", "1.00", "V", LimitTest::Verdict::Passed},
           {0x81, "Low", "0.11", "0.10", "1.00", "V", LimitTest::Verdict::Passed}}},
         {0xA2, "Misfire Cylinder 1 Data", {{0x0B, "Average", "3", "0", "65535", "", LimitTest::Verdict::Passed}}}}};
    list.push_back(vehicleOf({tests}));
    return list;
}

TEST(WholeReport, SuggestsInTheWordsThatAreKept)
{
    std::string text;
    for (VehicleReport const& report : suggestiveVehicles()) {
        for (Finding const& each : findings(report)) {
            if (!isSuggestion(each)) {
                continue;
            }
            text += std::string(each.kind) + " " + std::to_string(static_cast<int>(each.severity)) + ": " +
                    each.module + ", " + each.what + ": " + each.text + "\n";
            for (Evidence const& evidence : each.evidence) {
                text += "  " + anchorOf(evidence) + ": " + evidence.text + "\n";
            }
            for (std::string const& otherwise : each.otherwise) {
                text += "  or " + otherwise + "\n";
            }
        }
        text += "\n";
    }
    expectAsKept(text, "suggestions.txt");
}

TEST(WholeReport, IsJsonWithTheInspectionWhereOneIsWished)
{
    Json const json = Json::parse(reportJson(wholeVehicle(), wholeFacts()));
    EXPECT_EQ(json["inspection"]["suggests"], "not ready");
    ReportFacts plain = wholeFacts();
    plain.inspection = {};
    EXPECT_FALSE(Json::parse(reportJson(wholeVehicle(), plain)).contains("inspection"));
    EXPECT_EQ(parseReport(Json::parse(wholeVehicle().toJson())).toJson(), wholeVehicle().toJson());
    EXPECT_EQ(shownVin("12345", true), "12345");
    EXPECT_EQ(shownVin("123456", true), "000000");
    EXPECT_EQ(shownVin("123456", false), "123456");
}

TEST(WholeReport, NamesEachPlaceOfAnOxygenSensor)
{
    char const* const names[] = {"Bank 1 sensor 1", "Bank 1 sensor 2", "Bank 1 sensor 3", "Bank 1 sensor 4",
                                 "Bank 2 sensor 1", "Bank 2 sensor 2", "Bank 2 sensor 3", "Bank 2 sensor 4",
                                 "Bank 3 sensor 1", "Bank 3 sensor 2", "Bank 4 sensor 1", "Bank 4 sensor 2"};
    int number = 0;
    for (char const* const name : names) {
        EXPECT_EQ(locationName(static_cast<obd::OxygenSensorLocation>(number++)), name);
    }
}

} // namespace
