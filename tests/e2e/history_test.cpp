// The history by the program itself, in a file of the test's own.

#include "tests/e2e/childprocess.h"
#include "tests/support/json/jsonschema.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <cstdlib>
#include <filesystem>
#include <fstream>

namespace {

using e2e::Outcome;
using e2e::runVelmora;

class HistoryRun : public testing::Test
{
protected:
    HistoryRun() { use("history.db"); }
    ~HistoryRun() override { ::unsetenv("VELMORA_HISTORY"); }

    void use(std::string const& name) const { ::setenv("VELMORA_HISTORY", m_folder.file(name).c_str(), 1); }

    static Outcome scan(std::string const& car, std::vector<std::string> const& more)
    {
        std::vector<std::string> arguments = {"-q", "-p", "sim:" + car + "?instant", "scan"};
        arguments.insert(arguments.end(), more.begin(), more.end());
        return runVelmora(arguments);
    }

    static nlohmann::json list()
    {
        std::string const text = runVelmora({"--json", "history"}).out;
        support::expectValid(text, "history");
        return nlohmann::json::parse(text);
    }

    // Keeps a scan of each car, in which every list of codes was read. To a program that the machine stops for a second
    // a module is silent, and what it did not tell is not compared: then all are scanned anew.
    static void keepWhole(std::vector<std::string> const& cars, std::string const& name)
    {
        for (int attempt = 0; attempt < 5; ++attempt) {
            bool whole = true;
            for (std::string const& car : cars) {
                Outcome const kept = scan(car, {"--json", "--history", "--vehicle", name});
                ASSERT_EQ(kept.exitCode, 0) << kept.err;
                nlohmann::json const report = nlohmann::json::parse(kept.out);
                for (nlohmann::json const& module : report.at("modules")) {
                    whole = whole && module.at("codes").at("confirmed").at("answer") == "read" &&
                            module.at("codes").at("permanent").at("answer") == "read";
                }
            }
            if (whole) {
                return;
            }
            runVelmora({"-y", "history", "forget", name});
        }
        FAIL() << "no scan was whole";
    }

    testsupport::TemporaryFolder const m_folder;
};

TEST_F(HistoryRun, KeepsNothingUnlessItIsWished)
{
    EXPECT_EQ(scan("petrol-can11", {}).exitCode, 0) << "without a terminal nobody is asked";
    EXPECT_EQ(scan("petrol-can11", {"--no-history"}).exitCode, 0);
    EXPECT_FALSE(std::filesystem::exists(m_folder.file("history.db")));
    EXPECT_TRUE(list().empty());
    EXPECT_EQ(scan("petrol-can11", {"--history", "--no-history"}).exitCode, 2);
    Outcome const empty = runVelmora({"diff"});
    EXPECT_EQ(empty.exitCode, 2);
    EXPECT_NE(empty.err.find("scan --history"), std::string::npos) << empty.err;
}

TEST_F(HistoryRun, ComparesShowsCarriesAndForgets)
{
    ASSERT_EQ(scan("petrol-can11", {"--history"}).exitCode, 0);
    ASSERT_EQ(scan("petrol-can11", {"--history", "--mask-vin"}).exitCode, 0);
    ASSERT_EQ(scan("diesel-can29", {"--history"}).exitCode, 0);
    nlohmann::json const scans = list();
    ASSERT_EQ(scans.size(), 3U);
    EXPECT_EQ(scans[1]["vehicle"], "VELMRAS1MM0000001") << "masked in reports only";
    EXPECT_EQ(scans[0]["codes"], (nlohmann::json{"P0133", "P0171"}));

    Outcome const same = runVelmora({"--json", "diff", "--check", "--vehicle", "VELMRAS1MM0000001"});
    EXPECT_EQ(same.exitCode, 0) << same.err;
    support::expectValid(same.out, "diff");
    EXPECT_EQ(runVelmora({"diff", "1", "3"}).exitCode, 2) << "of two vehicles";
    EXPECT_EQ(runVelmora({"diff", "2"}).exitCode, 2) << "the newest with itself";
    support::expectValid(runVelmora({"--json", "history", "show", "1"}).out, "scan");
    EXPECT_NE(runVelmora({"history", "show", "1"}).out.find("P0133"), std::string::npos);
    EXPECT_EQ(runVelmora({"history", "show", "9"}).exitCode, 2);

    std::string const file = m_folder.file("all.ndjson");
    ASSERT_EQ(runVelmora({"history", "export", file}).exitCode, 0);
    EXPECT_EQ(runVelmora({"history", "export", file}).exitCode, 1) << "it stands already";
    EXPECT_EQ(std::filesystem::status(file).permissions(),
              std::filesystem::perms::owner_read | std::filesystem::perms::owner_write);
    use("other.db");
    ASSERT_EQ(runVelmora({"history", "import", file}).exitCode, 0);
    EXPECT_NE(runVelmora({"history", "import", file}).out.find("3 scans known"), std::string::npos);
    EXPECT_EQ(runVelmora({"history", "export", "-"}).out, m_folder.read("all.ndjson"));

    EXPECT_EQ(runVelmora({"history", "forget", "VELMRAS1MM0000001"}).exitCode, 2) << "nobody to ask";
    EXPECT_EQ(list().size(), 3U);
    EXPECT_EQ(runVelmora({"-y", "history", "forget", "VELMRAS1MM0000001"}).exitCode, 0);
    EXPECT_EQ(list().size(), 1U);
}

// Asked once, on a terminal: yes keeps this scan and those to come, no keeps none, and neither is asked again.
TEST_F(HistoryRun, AsksOnceOnATerminalAndRemembersTheAnswer)
{
    std::string const question = "Keep this scan and those to come? [y/N]";
    auto const scanOnTerminal = [&](char const* settings, char const* answer) {
        return e2e::runOnTerminal({"--settings", m_folder.file(settings), "-p", "sim:petrol-can11?instant", "scan"}, {},
                                  question, answer);
    };
    Outcome const yes = scanOnTerminal("yes.toml", "y\n");
    EXPECT_EQ(yes.exitCode, 0) << yes.out;
    EXPECT_NE(yes.out.find(m_folder.file("history.db")), std::string::npos) << "told where: " << yes.out;
    EXPECT_NE(yes.out.find("Kept as scan 1 of VELMRAS1MM0000001"), std::string::npos) << yes.out;
    Outcome const again = scanOnTerminal("yes.toml", "n\n");
    EXPECT_EQ(again.out.find(question), std::string::npos) << again.out;
    EXPECT_EQ(list().size(), 2U);
    EXPECT_EQ(std::filesystem::status(m_folder.file("history.db")).permissions(),
              std::filesystem::perms::owner_read | std::filesystem::perms::owner_write);

    use("none.db");
    Outcome const no = scanOnTerminal("no.toml", "n\n");
    EXPECT_EQ(no.exitCode, 0) << no.out;
    EXPECT_NE(no.out.find("Nothing is kept"), std::string::npos) << no.out;
    Outcome const still = scanOnTerminal("no.toml", "y\n");
    EXPECT_EQ(still.out.find(question), std::string::npos) << still.out;
    EXPECT_FALSE(std::filesystem::exists(m_folder.file("none.db")));
}

// A car that tells no VIN is known by its name, and what got worse with it by the exit code.
TEST_F(HistoryRun, TellsByItsExitCodeThatSomethingGotWorse)
{
    auto const car = [this](char const* name, char const* stored) {
        std::string const file = m_folder.file(name);
        std::ofstream(file) << "name = \"nameless\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\nlatency = 2\n"
                            << "refuses = false\nlamp = false\nstored = [" << stored
                            << "]\npending = []\npermanent = []\nlive = \"04 05 0C 0D\"\n[module.fixed]\n\"1C\" = "
                               "\"06\"\n[module.monitors]\nsupported = [\"misfire\"]\n";
        return file;
    };
    std::string const sound = car("sound.toml", "");
    std::string const broken = car("broken.toml", "\"P0171\"");
    Outcome const nameless = scan(sound, {"--history"});
    EXPECT_EQ(nameless.exitCode, 1) << "the report is shown, the keeping failed";
    EXPECT_NE(nameless.err.find("--vehicle NAME"), std::string::npos) << nameless.err;
    EXPECT_NE(nameless.out.find("Control module"), std::string::npos);
    keepWhole({sound, broken}, "golf");
    Outcome const worse = runVelmora({"diff", "--check"});
    EXPECT_EQ(worse.exitCode, 10) << worse.out << worse.err;
    EXPECT_NE(worse.out.find("P0171"), std::string::npos) << worse.out;
    EXPECT_EQ(runVelmora({"diff"}).exitCode, 0);
    nlohmann::json const scans = list();
    ASSERT_EQ(scans.size(), 2U);
    bool const brokenFirst = scans[1]["codes"].empty();
    std::string const newer = scans[brokenFirst ? 0 : 1]["number"].dump();
    std::string const older = scans[brokenFirst ? 1 : 0]["number"].dump();
    EXPECT_EQ(runVelmora({"diff", newer, older, "--check"}).exitCode, 0) << "the other way it got better";
}

} // namespace
