// The reports of all recorded cars whose masks were captured, by the program itself.

#include "tests/e2e/childprocess.h"
#include "tests/support/jsonschema.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <algorithm>
#include <filesystem>
#include <set>

namespace {

using nlohmann::json;

// Recordings that begin behind the first request of a connection, or whose link no replay brings up: nothing to report.
std::set<std::string> const unreported = {"can11-i10-2010-test-results", "can11-vw-ble-identity",
                                          "iso9141-bench-one-byte-a-line"};

std::string htmlText(std::string const& text)
{
    std::string escaped;
    for (char const each : text) {
        escaped += each == '&' ? "&amp;" : each == '<' ? "&lt;" : each == '>' ? "&gt;" : std::string(1, each);
    }
    return escaped;
}

// Modules, codes and values of a report: what a person must find in the page.
std::set<std::string> wantedIn(json const& report)
{
    std::set<std::string> texts;
    auto const add = [&texts](json const& value) {
        if (value.is_string()) {
            texts.insert(value.get<std::string>());
        }
    };
    for (json const& module : report["modules"]) {
        add(module["id"]);
        add(module["info"]["vin"]);
        for (json const& each : module["info"]["calibrations"]) {
            add(each["id"]);
        }
        for (char const* const kind : {"confirmed", "pending", "permanent"}) {
            for (json const& code : module["codes"][kind]["codes"]) {
                add(code["code"]);
            }
        }
        for (json const& value : module["values"]) {
            add(value["value"]);
        }
        for (json const& monitor : module["monitors"]["monitors"]) {
            for (json const& test : monitor["tests"]) {
                add(test["value"]);
            }
        }
    }
    return texts;
}

class RecordedReport : public testing::TestWithParam<std::string>
{};

TEST_P(RecordedReport, HoldsEveryCodeValueAndModule)
{
    testsupport::TemporaryFolder const folder;
    std::string const dialogue = std::string(VELMORA_SOURCE_DIR "/tests/dialogues/") + GetParam() + ".dialogue";
    e2e::Outcome const outcome = e2e::runVelmora(
        {"-q", "-p", "replay:" + dialogue, "scan", "--report", folder.file("car.html"), "--report",
         folder.file("car.json"), "--report", folder.file("car.md"), "--report", folder.file("car.txt")});
    if (unreported.contains(GetParam())) {
        EXPECT_NE(outcome.exitCode, 0);
        EXPECT_FALSE(std::filesystem::exists(folder.file("car.html")));
        return;
    }
    ASSERT_EQ(outcome.exitCode, 0) << outcome.err;
    std::string const document = folder.read("car.json");
    support::expectValid(document, "scan");
    EXPECT_EQ(folder.read("car.txt"), outcome.out);
    std::string const html = folder.read("car.html");
    std::string markdown = folder.read("car.md");
    std::erase(markdown, '\\');
    std::set<std::string> const wanted = wantedIn(json::parse(document));
    EXPECT_FALSE(wanted.empty());
    for (std::string const& text : wanted) {
        EXPECT_NE(html.find(htmlText(text)), std::string::npos) << text;
        EXPECT_NE(markdown.find(text), std::string::npos) << text;
    }
}

std::vector<std::string> recordedNames()
{
    std::vector<std::string> names;
    for (auto const& entry : std::filesystem::directory_iterator(VELMORA_SOURCE_DIR "/tests/dialogues")) {
        if (entry.path().extension() == ".supported") {
            names.push_back(entry.path().stem().string());
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

INSTANTIATE_TEST_SUITE_P(Dialogues, RecordedReport, testing::ValuesIn(recordedNames()), recordedName);

} // namespace
