#include "libvelmora/report/reportdocument.h"
#include "libvelmora/report/reportfile.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <functional>
#include <sstream>

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

// Every text of the JSON document that a person is to find again.
void forEachText(nlohmann::json const& value, std::function<void(std::string const&)> const& visit)
{
    if (value.is_structured()) {
        for (nlohmann::json const& inner : value) {
            forEachText(inner, visit);
        }
    } else if (value.is_string()) {
        visit(value.get<std::string>());
    }
}

TEST(ReportDocument, HoldsEveryTextOfTheJsonInHtmlAndMarkdown)
{
    VehicleReport const report = richVehicle();
    std::string const html = unescaped(toHtml(makeDocument(report, facts)));
    std::string markdown = toMarkdown(makeDocument(report, facts));
    std::erase(markdown, '\\');
    int texts = 0;
    forEachText(nlohmann::json::parse(report.toJson()), [&](std::string const& text) {
        if (text == "read" || text == "Powertrain" || text == "0C" || text == "unreadable" || text.empty()) {
            return; // words of the JSON alone, and counts of what is listed
        }
        ++texts;
        EXPECT_NE(html.find(text), std::string::npos) << text;
        EXPECT_NE(markdown.find(text), std::string::npos) << text;
    });
    EXPECT_GT(texts, 20);
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
    EXPECT_NE(untold.find("not told"), std::string::npos) << "the lamp";
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
    std::filesystem::path const folder = std::filesystem::path(testing::TempDir()) / "velmora-reports";
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
    EXPECT_THROW(writeReport((folder / "car.txt").string(), {}, facts, "", false), Error) << "it stands already";
    EXPECT_NO_THROW(writeReport((folder / "car.txt").string(), {}, facts, "", true));
    EXPECT_THROW(reportFormOf("car.pdf"), Error);
    EXPECT_THROW(writeReport("/nowhere/at/all.txt", {}, facts, "", false), Error);
    std::filesystem::remove_all(folder);
}

} // namespace
