// Modules beyond OBD as a user meets them: found, probed, their codes and signals read.

#include "tests/e2e/childprocess.h"
#include "tests/support/json/jsonschema.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <fstream>

namespace {

using e2e::Outcome;
using e2e::runVelmora;
using nlohmann::json;
using support::expectValid;
using testing::HasSubstr;
using testing::Not;

class Signals : public testing::Test
{
protected:
    Outcome run(std::vector<std::string> arguments, std::string const& car = "petrol-can11-modules")
    {
        std::vector<std::string> all{"-q", "--settings", m_folder.file("settings.toml"), "-p",
                                     "sim:" + car + "?instant"};
        all.insert(all.end(), arguments.begin(), arguments.end());
        return runVelmora(all);
    }

    testsupport::TemporaryFolder m_folder;
};

TEST_F(Signals, ModulesAreFoundRememberedAndTellTheirCodes)
{
    Outcome const found = run({"--json", "modules"});
    ASSERT_EQ(found.exitCode, 0) << found.err;
    expectValid(found.out, "modules");
    std::map<std::string, json> byRequest;
    for (json const& each : json::parse(found.out)) {
        byRequest[each["request"]] = each;
    }
    ASSERT_TRUE(byRequest.contains("743")) << found.out;
    EXPECT_EQ(byRequest["743"]["reply"], "763");
    EXPECT_EQ(byRequest["743"]["part"], "28400-S1004");
    EXPECT_EQ(byRequest["743"]["software"], "BCM-0023");
    ASSERT_TRUE(byRequest.contains("7E0"));
    EXPECT_EQ(byRequest["7E0"]["codes"], 1);
    ASSERT_TRUE(byRequest.contains("7D6")) << "an old one that refuses the question";
    EXPECT_EQ(byRequest["7D6"]["identifiers"]["1A90"], "S1M60000022");
    EXPECT_FALSE(byRequest.contains("7DF"));
    Outcome const again = run({"--json", "modules", "--all"});
    EXPECT_EQ(again.exitCode, 0);
    expectValid(again.out, "modules");
    EXPECT_THAT(again.out, HasSubstr("\"F190\": \"VELMRAS1M60000022\""));

    Outcome const codes = run({"--json", "codes", "--uds"});
    EXPECT_EQ(codes.exitCode, 0) << codes.err;
    expectValid(codes.out, "udsCodes");
    std::map<std::string, json> byModule;
    for (json const& each : json::parse(codes.out)) {
        byModule[each["module"]] = each;
    }
    json const& code = byModule["7E8"]["codes"][0];
    EXPECT_EQ(code["code"], "P0133");
    EXPECT_EQ(code["failure"], "No Subtype Information");
    EXPECT_EQ(code["states"], json::parse(R"(["present", "confirmed", "lamp"])"));
    EXPECT_THAT(code["meaning"].get<std::string>(), HasSubstr("O2 Sensor"));
    EXPECT_TRUE(byModule.contains("763")) << "the modules that were found are asked, too";
    EXPECT_EQ(byModule["7DE"]["byService18"], json::parse(R"([{"hex": "4155", "status": "60"}])")) << codes.out;
    EXPECT_EQ(byModule["7DE"]["codes"], nullptr);
}

TEST_F(Signals, ModulesOfAKLineTellWhatIso14230Has)
{
    Outcome const found = run({"--json", "modules"}, "petrol-kwp-fast");
    ASSERT_EQ(found.exitCode, 0) << found.err;
    expectValid(found.out, "modules");
    json const modules = json::parse(found.out);
    ASSERT_EQ(modules.size(), 2U) << found.out;
    EXPECT_EQ(modules[0]["request"], "8011F1");
    EXPECT_EQ(modules[0]["codes"], 1);
    EXPECT_EQ(modules[0]["identifiers"]["1A90"], "VELMRAK1M70000004");
    EXPECT_EQ(modules[1]["codes"], nullptr) << "it is silent";
    Outcome const codes = run({"codes", "--uds"}, "petrol-kwp-fast");
    EXPECT_EQ(codes.exitCode, 0) << codes.err;
    EXPECT_THAT(codes.out, HasSubstr("0420  status E8"));
    EXPECT_THAT(codes.out, Not(HasSubstr("Catalyst"))) << "nobody says that the number is one of SAE J2012";
    Outcome const info = run({"--json", "info", "--uds"}, "electric-can11");
    EXPECT_EQ(info.exitCode, 0) << info.err;
    expectValid(info.out, "info");
    EXPECT_THAT(info.out, HasSubstr("\"F195\": \"BC-0412\""));
    EXPECT_EQ(run({"modules"}, "petrol-vpw").exitCode, 6);
}

TEST_F(Signals, AWatchChecksTheFilesThatItsSettingsName)
{
    std::ofstream(m_folder.file("mine.toml")) << "[[signal]]\nid = \"X\"\nname = \"X\"\nrequest = \"2E01\"\n"
                                                 "formula = \"A+\"\n";
    std::ofstream(m_folder.file("watch.toml")) << "signals = [\"mine.toml\"]\n";
    Outcome const wrong = run({"watch", "--config", m_folder.file("watch.toml"), "--check-config"});
    EXPECT_EQ(wrong.exitCode, 2);
    EXPECT_THAT(wrong.err, HasSubstr("mine.toml:4: signal 1, request: service 2E writes"));
    EXPECT_THAT(wrong.err, HasSubstr("mine.toml:5: signal 1, formula"));
    std::ofstream(m_folder.file("mine.toml")) << "[[signal]]\nid = \"X\"\nname = \"X\"\nrequest = \"2101\"\n"
                                                 "formula = \"A\"\n";
    Outcome const right = run({"watch", "--config", m_folder.file("watch.toml"), "--check-config"});
    EXPECT_EQ(right.exitCode, 0) << right.err;
}

TEST_F(Signals, AProbeWritesAFileToStartFrom)
{
    std::string const file = m_folder.file("found.toml");
    Outcome const probe = run({"--json", "signals", "probe", "--module", "743", "--reply", "763", "--from", "F186",
                               "--to", "F189", "-o", file});
    ASSERT_EQ(probe.exitCode, 0) << probe.err;
    expectValid(probe.out, "signalsProbe");
    json const document = json::parse(probe.out);
    ASSERT_EQ(document["told"].size(), 1U) << probe.out;
    EXPECT_EQ(document["told"][0]["text"], "28400-S1004");
    Outcome const live = run({"--json", "--signals", file, "live", "M743_22_F187", "A6", "-n", "1"});
    ASSERT_EQ(live.exitCode, 0) << live.err;
    std::string const line = live.out.substr(0, live.out.find('\n'));
    expectValid(line, "live");
    EXPECT_THAT(live.out, HasSubstr("28400-S1004"));
    EXPECT_THAT(live.out, HasSubstr("\"sensor\":\"ODOMETER\""));
    Outcome const twice = run({"signals", "probe", "--module", "743", "--reply", "763", "-o", file});
    EXPECT_EQ(twice.exitCode, 2);
    EXPECT_THAT(twice.err, HasSubstr("is there already"));
    Outcome const session = run({"signals", "probe", "--service", "10", "-o", m_folder.file("x.toml")});
    EXPECT_EQ(session.exitCode, 2);
    EXPECT_THAT(session.err, HasSubstr("changes the session"));
    Outcome const list = run({"--json", "signals", "list", file});
    expectValid(list.out, "signalsList");
}

} // namespace
