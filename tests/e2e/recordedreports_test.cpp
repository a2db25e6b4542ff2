// The reports of all recorded cars, by the program itself. A recording with headers is replayed; of those without,
// whose modules can't be told apart, the simulator has cars that answer as they did.

#include "tests/e2e/childprocess.h"
#include "tests/support/dialogue/recordeddialogue.h"
#include "tests/support/json/jsonschema.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <algorithm>
#include <filesystem>
#include <set>

namespace {

using nlohmann::json;

std::filesystem::path const recordings = VELMORA_SOURCE_DIR "/tests/dialogues";

// A text of a bench, not of a car, whose echo and lines of one byte no replay brings a connection up with.
std::string const benchText = "iso9141-bench-one-byte-a-line";

std::string htmlText(std::string const& text)
{
    std::string escaped;
    for (char const each : text) {
        escaped += each == '&' ? "&amp;" : each == '<' ? "&lt;" : each == '>' ? "&gt;" : std::string(1, each);
    }
    return escaped;
}

void addTests(std::set<std::string>& texts, json const& tests)
{
    for (json const& test : tests) {
        std::string const description = test["description"].is_string() ? test["description"] : json("");
        texts.insert(test["id"].get<std::string>() + " " + description);
        for (char const* const key : {"value", "minimum", "maximum", "unit"}) {
            texts.insert(test[key].is_string() ? test[key].get<std::string>() : "-");
        }
    }
}

// What a person must find in the tables of a control module, each in a cell of its own.
std::set<std::string> wantedOf(json const& module)
{
    std::set<std::string> texts;
    auto const add = [&texts](json const& value) { texts.insert(value.is_string() ? value.get<std::string>() : "-"); };
    for (char const* const kind : {"confirmed", "pending", "permanent"}) {
        for (json const& code : module["codes"][kind]["codes"]) {
            add(code["code"]);
        }
    }
    for (json const& value : module["values"]) {
        add(value["name"]);
        add(value["value"]);
    }
    for (json const& monitor : module["monitors"]["monitors"]) {
        addTests(texts, monitor["tests"]);
    }
    for (json const& sensor : module["oxygen"]["sensors"]) {
        addTests(texts, sensor.value("tests", json::array()));
    }
    for (json const& monitor : module["readiness"]["monitors"]) {
        add(monitor["name"]);
        add(monitor["sinceCleared"]);
    }
    for (json const& counter : module["counters"]["counters"]) {
        texts.insert(std::to_string(counter["value"].get<unsigned int>()));
    }
    if (json const& freeze = module["freeze"]["freeze"]; freeze.is_object()) {
        add(freeze["code"]["code"]);
        for (json const& reading : freeze["readings"]) {
            add(reading["name"]);
            add(reading["value"]);
        }
    }
    for (json const& each : module["info"]["calibrations"]) {
        add(each["id"].is_string() ? each["id"] : each["verification"]);
    }
    if (module["info"]["vin"].is_string()) {
        add(module["info"]["vin"]);
    }
    std::string const sensors = std::to_string(module["sensors"].size());
    texts.insert(module["supported"] == "read" ? sensors
                                               : sensors + " (not all that the module supports is known: " +
                                                     module["supported"].get<std::string>() + ")");
    return texts;
}

// The part of a document behind one anchor and before the next of its kind, or the end of the control modules.
std::string partOf(std::string const& document, std::string const& module)
{
    std::size_t const begin = document.find("id=\"info-" + module + "\"");
    if (begin == std::string::npos) {
        return {};
    }
    std::size_t const next = document.find("id=\"info-", begin + 1);
    return document.substr(begin, std::min(next, document.find("id=\"adapter\"", begin)) - begin);
}

bool hasCell(std::string const& html, std::string const& text)
{
    return html.find(">" + htmlText(text) + "<") != std::string::npos ||
           html.find(">" + htmlText(text) + " <svg") != std::string::npos;
}

bool hasMarkdownCell(std::string const& markdown, std::string const& text)
{
    return markdown.find("| " + text + " |") != std::string::npos ||
           markdown.find("| **" + text + "** |") != std::string::npos;
}

void expectReports(std::string const& port)
{
    testsupport::TemporaryFolder const folder;
    e2e::Outcome const outcome = e2e::runVelmora({"-q", "-p", port, "scan", "--report", folder.file("car.html"),
                                                  "--report", folder.file("car.json"), "--report",
                                                  folder.file("car.md"), "--report", folder.file("car.txt")});
    ASSERT_EQ(outcome.exitCode, 0) << outcome.err;
    std::string const document = folder.read("car.json");
    support::expectValid(document, "scan");
    EXPECT_EQ(folder.read("car.txt"), outcome.out);
    std::string markdown = folder.read("car.md");
    std::erase(markdown, '\\');
    std::string const page = folder.read("car.html");
    std::size_t told = 0;
    json const report = json::parse(document);
    for (json const& module : report["modules"]) {
        std::string const id = module["id"];
        std::string const cells = partOf(page, id);
        std::string const rows = partOf(markdown, id);
        for (std::string const& text : wantedOf(module)) {
            EXPECT_TRUE(hasCell(cells, text)) << id << " of the page: " << text;
            EXPECT_TRUE(hasMarkdownCell(rows, text)) << id << " in Markdown: " << text;
            ++told;
        }
        EXPECT_FALSE(cells.empty() || rows.empty()) << id;
    }
    EXPECT_GT(told, 0U) << "a report that tells nothing";
}

class RecordedReport : public testing::TestWithParam<std::string>
{};

TEST_P(RecordedReport, HoldsEveryCodeValueAndModule)
{
    bool const simulated = GetParam().starts_with("real-");
    expectReports(simulated ? "sim:" + GetParam() + "?instant"
                            : "replay:" + (recordings / (GetParam() + ".dialogue")).string());
}

std::string compact(std::string const& text)
{
    std::string result;
    for (char const each : text) {
        result += std::isalnum(static_cast<unsigned char>(each)) != 0 ? std::string(1, each) : "";
    }
    return result;
}

// Whether the car told what it supports, which is where every report begins.
bool tellsMasks(support::RecordedDialogue const& dialogue)
{
    return std::any_of(dialogue.exchanges.begin(), dialogue.exchanges.end(), [](support::Exchange const& exchange) {
        std::string const request = compact(exchange.request);
        return request.starts_with("0100") && request.size() <= 5 &&
               compact(exchange.reply).find("4100") != std::string::npos;
    });
}

std::vector<std::string> recordedNames(bool headers)
{
    std::vector<std::string> names;
    for (auto const& entry : std::filesystem::directory_iterator(recordings)) {
        if (entry.path().extension() != ".dialogue") {
            continue;
        }
        support::RecordedDialogue const dialogue = support::readDialogue(entry.path());
        bool const withHeaders = dialogue.header.at("headers") != "off";
        if (withHeaders == headers && tellsMasks(dialogue) && entry.path().stem() != benchText) {
            names.push_back(entry.path().stem().string());
        }
    }
    std::sort(names.begin(), names.end());
    return names;
}

std::vector<std::string> reportedNames()
{
    std::vector<std::string> names = recordedNames(true);
    for (auto const& entry : std::filesystem::directory_iterator(VELMORA_SOURCE_DIR "/simulator/vehicles")) {
        std::string const name = entry.path().stem().string();
        if (name.starts_with("real-")) {
            names.push_back(name);
        }
    }
    std::sort(names.begin(), names.end());
    return names;
}

std::string recordedName(testing::TestParamInfo<std::string> const& info)
{
    std::string name = info.param;
    std::replace(name.begin(), name.end(), '-', '_');
    return name;
}

INSTANTIATE_TEST_SUITE_P(Dialogues, RecordedReport, testing::ValuesIn(reportedNames()), recordedName);

// Without headers there is nothing to report, and the program says so rather than guess whose replies they are.
TEST(RecordedReports, NothingIsReportedOfRepliesWithoutHeaders)
{
    std::vector<std::string> const names = recordedNames(false);
    EXPECT_EQ(names.size() + recordedNames(true).size(), 24U);
    ASSERT_TRUE(std::count(names.begin(), names.end(), "can11-hyundai-i40-whole-session") == 1);
    testsupport::TemporaryFolder const folder;
    e2e::Outcome const outcome =
        e2e::runVelmora({"-q", "-p", "replay:" + (recordings / "can11-hyundai-i40-whole-session.dialogue").string(),
                         "scan", "--report", folder.file("car.html")});
    EXPECT_EQ(outcome.exitCode, 5) << outcome.err;
    EXPECT_NE(outcome.err.find("headers"), std::string::npos) << outcome.err;
    EXPECT_FALSE(std::filesystem::exists(folder.file("car.html")));
}

} // namespace
