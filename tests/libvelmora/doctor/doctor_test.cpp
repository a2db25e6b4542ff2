#include "libvelmora/doctor/adaptercheck.h"
#include "libvelmora/doctor/commandmatrix.h"
#include "libvelmora/doctor/doctor.h"
#include "libvelmora/record/dialoguerecorder.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <set>

namespace {

using velmora::CommandMatrix;
using velmora::DoctorCheck;
using velmora::DoctorReport;
using Verdict = DoctorCheck::Verdict;

// An adapter that knows what came with some versions, by the table itself.
CommandMatrix matrixOf(std::set<std::string> const& versions, std::string const& identity, bool isStn = false)
{
    return velmora::probeCommands(
        [&](std::string const& command) -> std::optional<std::string> {
            for (velmora::CommandRow const& row : velmora::commandRows()) {
                if (command == row.command && versions.contains(row.version) && (!isStn || row.onStn)) {
                    return row.answersOk ? "OK" : "12";
                }
            }
            return "?";
        },
        identity, isStn);
}

TEST(CommandMatrix, TellsTheLevelAndWhatIsMissing)
{
    std::set<std::string> const until14{"1.0", "1.1", "1.2", "1.3", "1.3a", "1.4", "1.4b"};
    CommandMatrix const honest = matrixOf(until14, "ELM327 v1.4b");
    EXPECT_EQ(honest.level, "1.4b");
    EXPECT_TRUE(honest.missing.empty());
    EXPECT_FALSE(honest.claimIsMadeUp);
    CommandMatrix const clone = matrixOf(until14, "ELM327 v2.1");
    EXPECT_EQ(clone.claimed, "2.1");
    EXPECT_EQ(clone.level, "1.4b");
    EXPECT_EQ(clone.missing, (std::vector<std::string>{"ATAMC", "ATCTM1"}));
    EXPECT_TRUE(matrixOf(until14, "ELM327 v1.5").claimIsMadeUp);
    EXPECT_TRUE(matrixOf(until14, "OBDII by somebody").claimed.empty());
    EXPECT_EQ(matrixOf(until14, "ELM327 v1.4b (by somebody)").claimed, "1.4b");
    EXPECT_EQ(matrixOf(until14, "ELM327 v1.4a").level, "1.4b");
    EXPECT_TRUE(matrixOf(until14, "ELM327 v1.4a").claimIsMadeUp);
    EXPECT_EQ(matrixOf({"1.0"}, "ELM327 v1.0").level, "1.0");
    EXPECT_EQ(matrixOf({}, "ELM327 v1.0").level, "");
}

TEST(CommandMatrix, AnStnIsHeldToItsOwnCommands)
{
    std::set<std::string> const all{"1.0", "1.1", "1.2", "1.3", "1.3a", "1.4", "1.4b", "2.0", "2.1", "2.2", "2.3"};
    EXPECT_FALSE(matrixOf(all, "ELM327 v2.3", true).missing.size() > 0);
}

TEST(CommandMatrix, WhoAgreesToAllProvesNothing)
{
    CommandMatrix const matrix = velmora::probeCommands([](std::string const&) { return "OK"; }, "ELM327 v1.5", false);
    EXPECT_TRUE(matrix.agreesToAll);
    EXPECT_TRUE(matrix.level.empty());
}

TEST(DoctorVoltage, IsJudgedByWhatItMeans)
{
    struct Case
    {
        char const* reply;
        Verdict verdict;
        char const* words;
    };
    Case const cases[] = {
        {"0.1V", Verdict::Bad, "none"},
        {"11.4V", Verdict::Note, "weak"},
        {"12.6V", Verdict::Good, "engine is off"},
        {"14.1V", Verdict::Good, "engine runs"},
    };
    for (Case const& each : cases) {
        DoctorCheck const check = velmora::judgeVoltage(each.reply).value();
        EXPECT_EQ(check.verdict, each.verdict) << each.reply;
        EXPECT_NE(check.finding.find(each.words), std::string::npos) << check.finding;
    }
    EXPECT_FALSE(velmora::judgeVoltage("?").has_value());
    EXPECT_FALSE(velmora::judgeVoltage("").has_value());
}

TEST(DoctorIgnition, IsWhatThePinSaysAndNoFaultAlone)
{
    EXPECT_EQ(velmora::judgeIgnition("ON")->verdict, Verdict::Good);
    EXPECT_EQ(velmora::judgeIgnition("OFF")->verdict, Verdict::Note);
    EXPECT_FALSE(velmora::judgeIgnition("?").has_value());
}

// What the matrix sends stays in force where no later row gives it back.
TEST(CommandMatrix, LeavesNoSettingThatTheAdapterWouldNotHaveAnyway)
{
    std::vector<std::string> sent;
    velmora::probeCommands(
        [&sent](std::string const& command) {
            sent.push_back(command);
            return "?";
        },
        "ELM327 v2.3", false);
    EXPECT_EQ(sent.front(), "ATQQ");
    auto const last = [&sent](std::string const& word) {
        return *std::find_if(sent.rbegin(), sent.rend(), [&](auto const& each) { return each.starts_with(word); });
    };
    EXPECT_EQ(last("ATAT"), "ATAT1");
    EXPECT_EQ(last("ATCAF"), "ATCAF1");
    EXPECT_GT(std::find(sent.begin(), sent.end(), "ATNL"), std::find(sent.begin(), sent.end(), "ATAL"));
}

class DoctorTest : public testing::Test
{
protected:
    DoctorReport examine(std::string const& port, std::string const& bundle = "")
    {
        velmora::SessionOptions options;
        options.port = port;
        options.settingsFile = m_settings;
        velmora::Session session(options);
        velmora::DialogueRecorder recorder;
        DoctorReport const report = velmora::examine(session, recorder);
        if (!bundle.empty()) {
            m_bundle = velmora::makeBundle(report, session, recorder, bundle == "with VIN");
        }
        return report;
    }

    static bool has(DoctorReport const& report, std::string const& link, std::string const& words)
    {
        return std::any_of(report.checks.begin(), report.checks.end(), [&](DoctorCheck const& check) {
            return check.link == link && check.finding.find(words) != std::string::npos;
        });
    }

    std::string m_settings = testsupport::ownPath("doctor.toml");
    std::string m_bundle;
};

TEST_F(DoctorTest, AHealthyChainIsMeasured)
{
    DoctorReport const report = examine("sim:petrol-can11?instant", "masked");
    EXPECT_TRUE(report.isHealthy()) << toText(report);
    EXPECT_TRUE(has(report, "adapter", "v1.5 is a version that its maker never made")) << toText(report);
    EXPECT_TRUE(has(report, "modules", "7E8 ECM"));
    EXPECT_TRUE(has(report, "bus", "CAN"));
    ASSERT_TRUE(report.figures.has_value());
    EXPECT_EQ(report.figures->requests, 20U);
    EXPECT_LE(report.figures->minimum, report.figures->median);
    EXPECT_LE(report.figures->median, report.figures->high);
    EXPECT_LE(report.figures->high, report.figures->maximum);
    EXPECT_EQ(report.figures->pidsPerRequest, 6U);
    EXPECT_GE(report.figures->longestReply, 20U); // the identification number
    EXPECT_GT(report.figures->valuesPerSecond, 0.0);
    EXPECT_TRUE(has(report, "ignition", "on")) << toText(report);
    EXPECT_EQ(toJson(report)["habits"].size(), report.habits.size());
    EXPECT_TRUE(std::any_of(report.habits.begin(), report.habits.end(), [](auto const& each) {
        return each.first == "notices in front of data";
    })) << toText(report);
    EXPECT_NE(m_bundle.find("Everything works"), std::string::npos);
    EXPECT_NE(m_bundle.find("0902"), std::string::npos);
}

TEST_F(DoctorTest, TheBundleKeepsTheVinOnlyWhenTold)
{
    std::ofstream(m_settings) << "[mqtt]\npassword = \"hunter2\"\n[common]\nunitsystem = 1\n"
                                 "[bluetooth.1]\naddress = \"00:1D:A5:68:98:8B\"\n";
    examine("sim:petrol-can11?instant", "masked");
    std::string const masked = m_bundle;
    examine("sim:petrol-can11?instant", "with VIN");
    EXPECT_EQ(masked.find("hunter2"), std::string::npos);
    EXPECT_NE(masked.find("unitsystem"), std::string::npos);
    EXPECT_NE(masked.find("00:1D:A5:xx:xx:xx"), std::string::npos) << masked;
    EXPECT_EQ(m_bundle.find("68:98:8B"), std::string::npos) << "whatever is told of the VIN";
    // The number ends in 000001.
    EXPECT_EQ(masked.find("303030303031"), std::string::npos);
    EXPECT_NE(masked.find("303030303030"), std::string::npos);
    EXPECT_NE(m_bundle.find("303030303031"), std::string::npos);
    std::filesystem::remove(m_settings);
}

TEST_F(DoctorTest, ALinkThatIsDeadIsNamed)
{
    DoctorReport const closed = examine("tcp://127.0.0.1:1");
    EXPECT_FALSE(closed.isHealthy());
    EXPECT_EQ(closed.checks.back().link, "port");
    EXPECT_NE(closed.verdict().find("The port is where it breaks"), std::string::npos) << closed.verdict();

    DoctorReport const missing = examine("/dev/velmora-none");
    EXPECT_TRUE(has(missing, "port", "there is no /dev/velmora-none"));
    EXPECT_FALSE(missing.figures.has_value());
}

} // namespace
