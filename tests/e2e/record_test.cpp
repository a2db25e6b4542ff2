// What record saves gives the same report again, and live traffic can be watched.

#include "tests/e2e/childprocess.h"
#include "tests/support/json/jsonschema.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>

namespace {

using e2e::ChildProcess;
using e2e::Outcome;
using e2e::runVelmora;

// A file that isn't there, and isn't afterwards.
class RecordTest : public testing::Test
{
protected:
    void SetUp() override { std::filesystem::remove(m_file); }
    void TearDown() override { std::filesystem::remove(m_file); }

    std::string content() const
    {
        std::ifstream in(m_file);
        return {std::istreambuf_iterator<char>(in), {}};
    }

    std::string const m_file =
        testsupport::ownPath(std::string(testing::UnitTest::GetInstance()->current_test_info()->name()) + ".dialogue");
};

} // namespace

TEST_F(RecordTest, ReplayGivesTheReportOfTheRecordedRun)
{
    Outcome const recorded =
        runVelmora({"-q", "-p", "sim:petrol-can11", "record", "--keep-vin", "--vehicle", "a car", m_file});
    ASSERT_EQ(recorded.exitCode, 0) << recorded.err;
    EXPECT_NE(recorded.out.find("VELMRAS1MM0000001"), std::string::npos) << recorded.out;
    EXPECT_TRUE(content().starts_with("vehicle: a car\nadapter: ELM327 v1.5\nprotocol: 6\nheaders: late\n"))
        << content();
    Outcome const replayed = runVelmora({"-q", "-p", "replay:" + m_file, "scan"});
    EXPECT_EQ(replayed.exitCode, 0) << replayed.err;
    EXPECT_EQ(replayed.out, recorded.out);
    Outcome const live = runVelmora({"-q", "-p", "replay:" + m_file, "live", "RPM", "-n", "1"});
    EXPECT_EQ(live.exitCode, 0) << live.err;
}

TEST_F(RecordTest, BlanksTheEndOfTheVinAndNothingElse)
{
    Outcome const recorded = runVelmora({"-q", "--json", "-p", "sim:petrol-vpw?instant", "record", m_file});
    ASSERT_EQ(recorded.exitCode, 0) << recorded.err;
    support::expectValid(recorded.out, "scan");
    Outcome const replayed = runVelmora({"-q", "--json", "-p", "replay:" + m_file, "scan"});
    EXPECT_EQ(replayed.exitCode, 0) << replayed.err;
    auto report = nlohmann::json::parse(recorded.out);
    auto& vin = report["modules"][0]["info"]["vin"];
    ASSERT_EQ(vin.get<std::string>().size(), 17U);
    vin = vin.get<std::string>().substr(0, 11) + "000000";
    EXPECT_EQ(nlohmann::json::parse(replayed.out), report);
}

TEST_F(RecordTest, KeepsWhatWasSaidBeforeTheLinkBroke)
{
    ChildProcess simulator(
        {"simulate", "--listen", "tcp://127.0.0.1:0", "--vehicle", "petrol-can11", "--fault", "loss@1200"});
    Outcome const outcome = runVelmora({"-q", "-p", simulator.readLine(), "record", m_file});
    EXPECT_EQ(outcome.exitCode, 8) << outcome.err;
    EXPECT_EQ(outcome.out, "");
    std::string const said = content();
    EXPECT_NE(said.find("-> 0100\n"), std::string::npos) << said;
    EXPECT_NE(said.find("4100BE3FB813"), std::string::npos) << said;
}

TEST_F(RecordTest, ReplacesNoFile)
{
    std::ofstream(m_file) << "another recording";
    Outcome const outcome = runVelmora({"-q", "-p", "sim:", "record", m_file});
    EXPECT_EQ(outcome.exitCode, 2);
    EXPECT_EQ(content(), "another recording");
}

TEST(Log, ShowsTheTrafficFromTheFirstCommandOn)
{
    Outcome const outcome = runVelmora({"-q", "-p", "sim:petrol-can11", "--json", "log", "RPM", "--duration", "1"});
    EXPECT_EQ(outcome.exitCode, 0) << outcome.err;
    std::size_t const end = outcome.out.find('\n');
    support::expectValid(outcome.out.substr(0, end), "log");
    EXPECT_EQ(nlohmann::json::parse(outcome.out.substr(0, end))["direction"], "sent");
    EXPECT_GE(std::count(outcome.out.begin(), outcome.out.end(), '\n'), 40);
    EXPECT_NE(outcome.out.find("\"data\":\"010C"), std::string::npos) << "the sensor is asked for";
}

TEST(Log, CountsFromWhereTheConnectionStands)
{
    Outcome const outcome = runVelmora({"-q", "-p", "sim:petrol-can11?instant", "log", "RPM", "-n", "4"});
    EXPECT_EQ(outcome.exitCode, 0) << outcome.err;
    std::size_t const asked = outcome.out.find(" 010C");
    ASSERT_NE(asked, std::string::npos) << "the sensor is asked for";
    // The first of them gives the adapter its own wait back.
    std::size_t const first = outcome.out.rfind(" ATST64", asked);
    auto const lineBegin = outcome.out.begin() + static_cast<std::ptrdiff_t>(outcome.out.rfind('\n', first) + 1);
    EXPECT_EQ(std::count(lineBegin, outcome.out.end(), '\n'), 4) << outcome.out;
}

// The library keeps an idle connection up from its first request on.
TEST(Log, WithoutASensorTheConnectionIsKeptUp)
{
    Outcome const outcome = runVelmora({"-q", "-p", "sim:petrol-can11?instant", "log", "-n", "4"});
    EXPECT_EQ(outcome.exitCode, 0) << outcome.err;
    std::size_t const stands = outcome.out.rfind(" ATST64");
    ASSERT_NE(stands, std::string::npos) << outcome.out;
    EXPECT_NE(outcome.out.find(" 0101", stands), std::string::npos) << outcome.out;
}
