// Questions: what was typed before they stood there answers none of them.

#include "tests/e2e/childprocess.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>

namespace {

using e2e::Outcome;
using e2e::runOnTerminal;
using e2e::runVelmora;

struct Question
{
    std::vector<std::string> arguments;
    std::string text;
    std::string done; // what is told only where the answer was yes
};

class QuestionRun : public testing::Test
{
protected:
    QuestionRun()
    {
        std::filesystem::create_directories(m_folder);
        ::setenv("VELMORA_HISTORY", (m_folder / "history.db").c_str(), 1);
    }
    ~QuestionRun() override
    {
        ::unsetenv("VELMORA_HISTORY");
        std::filesystem::remove_all(m_folder);
    }

    // A settings file of its own, so that scan asks each time.
    std::vector<std::string> arguments(std::vector<std::string> const& rest)
    {
        std::vector<std::string> all = {"-q", "--settings", (m_folder / std::to_string(++m_runs)).string() + ".toml",
                                        "-p", "sim:petrol-can11?instant"};
        all.insert(all.end(), rest.begin(), rest.end());
        return all;
    }

    std::filesystem::path const m_folder = testsupport::ownPath("questions");
    int m_runs = 0;
};

TEST_F(QuestionRun, AreNotAnsweredByWhatWasTypedBefore)
{
    ASSERT_EQ(runVelmora(arguments({"scan", "--history"})).exitCode, 0);
    for (Question const& each : {Question{{"clear"}, "Clear now?", ": cleared"},
                                 {{"routines", "--run", "01"}, "Run now?", "Result"},
                                 {{"scan"}, "Keep this scan and those to come?", "Kept as"},
                                 {{"history", "forget", "VELMRAS1MM0000001"}, "Forget them?", "Forgot"}}) {
        Outcome const refused = runOnTerminal(arguments(each.arguments), "yes\nyes\n", each.text, "no\n");
        EXPECT_NE(refused.out.find(each.text), std::string::npos) << refused.out;
        EXPECT_EQ(refused.out.find(each.done), std::string::npos) << refused.out;
    }
    EXPECT_NE(runVelmora(arguments({"history"})).out.find("VELMRAS1MM0000001"), std::string::npos) << "still kept";
    Outcome const agreed =
        runOnTerminal(arguments({"history", "forget", "VELMRAS1MM0000001"}), "no\n", "Forget them?", "yes\n");
    EXPECT_EQ(agreed.exitCode, 0) << agreed.out;
    EXPECT_EQ(runVelmora(arguments({"history"})).out.find("VELMRAS1MM0000001"), std::string::npos) << "forgotten";
}

TEST_F(QuestionRun, AWishToKeepThatFailsIsToldBehindTheScan)
{
    ::setenv("VELMORA_HISTORY", "/proc/nonexistent/history.db", 1);
    Outcome const wished = runVelmora(arguments({"scan", "--history"}));
    EXPECT_EQ(wished.exitCode, 1);
    EXPECT_EQ(wished.err.rfind("velmora: The scan is not kept: ", 0), 0U) << wished.err;
    EXPECT_EQ(wished.out.rfind("Adapter\n", 0), 0U) << "but told";
}

} // namespace
