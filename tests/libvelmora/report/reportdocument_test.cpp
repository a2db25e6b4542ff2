#include "libvelmora/report/document/htmlescape.h"
#include "libvelmora/report/document/reportdocument.h"
#include "libvelmora/report/document/reportfile.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <functional>
#include <sstream>
#include <string_view>

namespace {

using namespace velmora;

ModuleReport richModule()
{
    ModuleReport module{0x7E8, "<script>alert(1)</script>", {0x0C}, {}, {}, {}, {}, {}, {}, {}};
    module.info.vin = "1M8GDM9AXKP042788";
    module.info.standard = "OBD-II & EOBD";
    module.info.calibrations = {{"37805-RBB", "AB12CD34"}};
    module.info.sinceCleared.distance = InfoReport::Reading{"412", "km"};
    TroubleCode const code{"P0420", "Powertrain", {{"Generic", "Catalyst System Efficiency | Below Threshold"}}};
    module.codes = {true,
                    {{CodeKind::Confirmed, CodeList::Answer::Read, {}, {code}},
                     {CodeKind::Pending, CodeList::Answer::Silent, {}, {}},
                     {CodeKind::Permanent, CodeList::Answer::Refused, "service not supported (11)", {}}}};
    module.freeze = {0, TopicAnswer::Read,
                     FreezeFrame{code, {{"Engine RPM", "1726", "rpm"}, {"Speed", std::nullopt, "km/h"}}}};
    module.readiness = {TopicAnswer::Read, true, {{"Catalyst", ReadinessStatus::NotComplete, {}}}};
    module.monitors.answer = TopicAnswer::Read;
    module.monitors.monitors = {
        {0x21, "Catalyst Bank 1", {{0x80, "Storage", "0.5", "0", "1.0", "", LimitTest::Verdict::Passed}}}};
    module.counters = {TopicAnswer::Read, {{"Catalyst completions", 31}}};
    return module;
}

VehicleReport richVehicle()
{
    return {{"ELM327 v1.5", "OBDII to RS232", "", 12.3F}, {6, "ISO 15765-4"}, {richModule()}};
}

ReportFacts const facts = {"2026-05-01 10:00", "/dev/ttyUSB0", "9.9", false, 2026};

std::string unescaped(std::string text)
{
    for (auto const& [entity, sign] : {std::pair("&lt;", "<"), {"&gt;", ">"}, {"&quot;", "\""}, {"&amp;", "&"}}) {
        for (std::size_t at = text.find(entity); at != std::string::npos; at = text.find(entity)) {
            text.replace(at, std::string(entity).size(), sign);
        }
    }
    return text;
}

// Words for programs, which a page has in other words or not at all; the names of counters are in pairs there.
bool isForPrograms(std::string const& key)
{
    static constexpr std::string_view keys[] = {"kind",   "severity", "answer",     "lampAnswer", "supported",
                                                "pid",    "data",     "system",     "by",         "sensors",
                                                "result", "counter",  "modelYearBy"};
    return std::find(std::begin(keys), std::end(keys), key) != std::end(keys);
}

// Every text and number of the JSON document that a person is to find again.
void forEachText(nlohmann::json const& value, std::string const& key,
                 std::function<void(std::string const&)> const& visit)
{
    if (isForPrograms(key)) {
        return;
    }
    if (value.is_object()) {
        for (auto const& [inner, member] : value.items()) {
            forEachText(member, key == "counters" && inner == "name" ? "counter" : inner, visit);
        }
    } else if (value.is_array()) {
        for (nlohmann::json const& inner : value) {
            forEachText(inner, key, visit);
        }
    } else if (value.is_string()) {
        visit(value.get<std::string>());
    } else if (value.is_number_integer() && key == "value") {
        visit(std::to_string(value.get<long>()));
    }
}

TEST(ReportDocument, HoldsEveryTextOfTheJsonInHtmlAndMarkdown)
{
    VehicleReport const report = richVehicle();
    std::string const html = unescaped(toHtml(makeDocument(report, facts)));
    std::string markdown = toMarkdown(makeDocument(report, facts));
    std::erase(markdown, '\\');
    int texts = 0;
    forEachText(nlohmann::json::parse(report.toJson()), {}, [&](std::string const& text) {
        ++texts;
        EXPECT_NE(html.find(text), std::string::npos) << text;
        EXPECT_NE(markdown.find(text), std::string::npos) << text;
    });
    EXPECT_GT(texts, 40);
}

std::string between(std::string const& text, std::string const& begin, std::string const& end)
{
    std::size_t const from = text.find(begin);
    return from == std::string::npos ? "" : text.substr(from, text.find(end, from) - from);
}

TEST(ReportDocument, MarksWhatIsOpenSinceTheClearing)
{
    VehicleReport report = richVehicle();
    report.modules[0].readiness.monitors = {{"Catalyst", ReadinessStatus::NotComplete, ReadinessStatus::NotComplete},
                                            {"EGR", ReadinessStatus::Complete, ReadinessStatus::NotComplete}};
    std::string const html = toHtml(makeDocument(report, facts));
    std::string const open = between(html, "<td>Catalyst</td>", "</tr>");
    EXPECT_NE(open.find("class=\"mark\""), std::string::npos) << open;
    EXPECT_EQ(open.find("class=\"mark\""), open.rfind("class=\"mark\"")) << "this cycle counts not: " << open;
    EXPECT_EQ(between(html, "<td>EGR</td>", "</tr>").find("class=\"mark\""), std::string::npos);
}

TEST(ReportDocument, ShowsCountersAsRatios)
{
    VehicleReport report = richVehicle();
    report.modules[0].counters.counters = {{"OBD Monitoring Conditions Encountered Counts", 400},
                                           {"Catalyst Monitor Completion Counts Bank 1", 388},
                                           {"Catalyst Monitor Conditions Encountered Counts Bank 1", 412},
                                           {"EVAP Monitor Conditions Encountered Counts", 7}};
    std::string const html = toHtml(makeDocument(report, facts));
    EXPECT_NE(html.find("<td>Catalyst Monitor Bank 1</td><td class=\"number\">388</td><td class=\"number\">412</td>"
                        "<td class=\"number\">0.94</td>"),
              std::string::npos);
    EXPECT_NE(html.find("<td>EVAP Monitor</td><td class=\"number\">0</td><td class=\"number\">7</td>"
                        "<td class=\"number\">0.00</td>"),
              std::string::npos)
        << "counters that are 0 are not told";
    EXPECT_NE(html.find("<td>OBD Monitoring Conditions Encountered Counts</td>"), std::string::npos);
}

// Every link of the page has its target, and each id stands once.
TEST(ReportDocument, LeadsFromFindingsToTheirData)
{
    VehicleReport report = richVehicle();
    report.modules.push_back(report.modules[0]);
    report.modules[1].id = 0x7E9;
    std::string const html = toHtml(makeDocument(report, facts));
    int links = 0;
    for (std::size_t at = html.find("href=\"#"); at != std::string::npos; at = html.find("href=\"#", at + 1)) {
        std::string const anchor = html.substr(at + 7, html.find('"', at + 7) - at - 7);
        std::string const target = " id=\"" + anchor + "\"";
        std::size_t const found = html.find(target);
        EXPECT_NE(found, std::string::npos) << anchor;
        EXPECT_EQ(html.find(target, found + 1), std::string::npos) << anchor << " stands twice";
        ++links;
    }
    EXPECT_GT(links, 8);
    EXPECT_NE(html.find("href=\"#codes-7E9\""), std::string::npos);
}

// Bytes that are no text in UTF-8, and characters that HTML has no form for.
TEST(ReportDocument, ReplacesWhatIsNoText)
{
    for (std::string const bytes :
         {"\xFF", "\xC0\xAF", "\xE2\x82", "\xED\xA0\x80", "\xF5\x80\x80\x80", "\x01", "\x7F", "\xC2\x85"}) {
        EXPECT_NE(escapedHtml("a" + bytes + "b").find("\xEF\xBF\xBD"), std::string::npos)
            << testing::PrintToString(bytes);
        EXPECT_EQ(escapedHtml("a" + bytes + "b").back(), 'b');
    }
    for (std::string const whole : {"\x7E", "\xC2\xA0", "\xDF\xBF", "\xE0\xA0\x80", "\xED\x9F\xBF", "\xEE\x80\x80",
                                    "\xF0\x90\x80\x80", "\xF4\x8F\xBF\xBF", "\n", "\t", " "}) {
        EXPECT_EQ(escapedHtml("a" + whole + "b"), "a" + whole + "b") << testing::PrintToString(whole);
    }
    for (std::string const broken : {"\xE0\x9F\xBF", "\xF0\x8F\xBF\xBF", "\xF4\x90\x80\x80", "\xC1\xBF", "\x80",
                                     "\xC2\x9F", "\x1F", "\xF5\x80\x80\x80", "\xC2"}) {
        EXPECT_TRUE(escapedHtml("a" + broken).starts_with("a\xEF\xBF\xBD")) << testing::PrintToString(broken);
    }
    std::string const sign = "\xEF\xBF\xBD";
    EXPECT_EQ(escapedHtml("\x80\x80"), sign + sign) << "bytes that go on with nothing";
    EXPECT_EQ(escapedHtml("\xC3"
                          "A"),
              sign + "A");
    EXPECT_EQ(escapedHtml("\xE2\x82"
                          "A"),
              sign + sign + "A");
    EXPECT_EQ(escapedHtml("\xFF&"), sign + "&amp;");
    EXPECT_EQ(escapedHtml("\x01\x02<"), sign + sign + "&lt;");
    EXPECT_EQ(escapedHtml("\u00E9 \u20AC \U0001F697"), "\u00E9 \u20AC \U0001F697");
    EXPECT_EQ(escapedHtml("\"<&>'"), "&quot;&lt;&amp;&gt;'");
}

TEST(ReportDocument, EscapesWhatTheVehicleSays)
{
    std::string const html = toHtml(makeDocument(richVehicle(), facts));
    EXPECT_EQ(html.find("<script"), std::string::npos);
    EXPECT_NE(html.find("&lt;script&gt;alert(1)"), std::string::npos);
    EXPECT_NE(html.find("OBD-II &amp; EOBD"), std::string::npos);
    EXPECT_NE(html.find("default-src 'none'"), std::string::npos) << "scripts are forbidden";
    std::string const markdown = toMarkdown(makeDocument(richVehicle(), facts));
    EXPECT_NE(markdown.find("Efficiency \\| Below"), std::string::npos) << "a pipe would end the cell";
    EXPECT_NE(markdown.find("\\<script\\>"), std::string::npos);
}

TEST(ReportDocument, TellsSilenceAndRefusalAsWhatTheyAre)
{
    std::string const html = toHtml(makeDocument(richVehicle(), facts));
    EXPECT_NE(html.find("no answer"), std::string::npos);
    EXPECT_NE(html.find("refused: service not supported (11)"), std::string::npos);
    EXPECT_EQ(html.find("none stored"), std::string::npos);
    ModuleReport silent{0x7E9, "", {}, {}, {}, {}, {}, {}, {}, {}};
    std::string const untold = toHtml(makeDocument({{}, {}, {silent}}, facts));
    EXPECT_NE(untold.find("not reported"), std::string::npos) << "the lamp";
    EXPECT_EQ(untold.find("Freeze frame 0"), std::string::npos) << "nor what is not offered";
    silent.freeze.answer = TopicAnswer::Silent;
    std::string const lost = toHtml(makeDocument({{}, {}, {silent}}, facts));
    EXPECT_NE(lost.find("no answer", lost.find("Freeze frame 0")), std::string::npos);
}

TEST(ReportDocument, DrawsABarWhereThereAreLimits)
{
    VehicleReport report = richVehicle();
    LimitTest& test = report.modules[0].monitors.monitors[0].tests[0];
    EXPECT_NE(toHtml(makeDocument(report, facts)).find("<svg"), std::string::npos);
    test.minimum = test.maximum = "";
    EXPECT_EQ(toHtml(makeDocument(report, facts)).find("<svg"), std::string::npos);
    test.minimum = "2";
    test.maximum = "1";
    EXPECT_EQ(toHtml(makeDocument(report, facts)).find("<svg"), std::string::npos) << "limits that can't be";
    test.minimum = "0";
    test.verdict = LimitTest::Verdict::NoResult;
    EXPECT_EQ(toHtml(makeDocument(report, facts)).find("<svg"), std::string::npos) << "no result yet";
}

TEST(ReportDocument, MasksTheVinEverywhere)
{
    ReportFacts masked = facts;
    masked.maskVin = true;
    VehicleReport const report = withShownVins(richVehicle(), masked);
    for (std::string const& text :
         {toHtml(makeDocument(report, masked)), toMarkdown(makeDocument(report, masked)), report.toJson()}) {
        EXPECT_EQ(text.find("042788"), std::string::npos);
        EXPECT_NE(text.find("1M8GDM9AXKP000000"), std::string::npos);
    }
}

TEST(ReportFile, WritesEachFormByItsEnding)
{
    std::filesystem::path const folder = testsupport::ownPath("reports");
    std::filesystem::create_directories(folder);
    auto const written = [&](char const* name) {
        std::string const path = (folder / name).string();
        std::filesystem::remove(path);
        writeReport(path, richVehicle(), facts, "the text\n", false);
        std::ostringstream text;
        text << std::ifstream(path).rdbuf();
        return text.str();
    };
    EXPECT_TRUE(written("car.html").starts_with("<!DOCTYPE html>"));
    EXPECT_TRUE(written("car.md").starts_with("# "));
    EXPECT_TRUE(nlohmann::json::accept(written("car.json")));
    EXPECT_EQ(written("car.txt"), "the text\n");
    try {
        writeReport((folder / "car.txt").string(), {}, facts, "", false);
        FAIL() << "it stands already";
    } catch (Error const& error) {
        EXPECT_EQ(error.kind(), ErrorKind::WrongUse);
    }
    EXPECT_NO_THROW(writeReport((folder / "car.txt").string(), {}, facts, "", true));
    EXPECT_THROW(reportFormOf("car.pdf"), Error);
    EXPECT_THROW(writeReport("/nowhere/at/all.txt", {}, facts, "", false), Error);
    std::filesystem::remove_all(folder);
}

} // namespace
