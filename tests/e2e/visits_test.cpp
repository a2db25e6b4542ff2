// What one visit leaves for the next, and what is told of the adapter on the way.

#include "tests/e2e/childprocess.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

namespace {

using testing::HasSubstr;
using testing::Not;

class Visits : public testing::Test
{
protected:
    Visits() { std::filesystem::create_directories(m_folder); }
    ~Visits() override { std::filesystem::remove_all(m_folder); }

    e2e::Outcome visit(std::vector<std::string> const& options)
    {
        std::vector<std::string> arguments{"-v",      "-p",   m_adapter, "--settings", m_folder / "settings.toml",
                                           "--trace", m_trace};
        arguments.insert(arguments.end(), options.begin(), options.end());
        arguments.emplace_back("sensors");
        e2e::Outcome outcome = e2e::runVelmora(arguments);
        EXPECT_EQ(outcome.exitCode, 0) << outcome.err;
        return outcome;
    }
    std::string trace() const
    {
        std::ifstream in(m_trace);
        return {std::istreambuf_iterator<char>(in), {}};
    }

    std::filesystem::path m_folder = testsupport::ownPath("visits-e2e");
    std::string m_trace = m_folder / "trace.txt";
    // Listens for 300 ms behind each reply, whatever it agrees to.
    e2e::ChildProcess m_simulator{{"simulate", "--listen", "tcp://127.0.0.1:0", "--vehicle", "bench-can11", "--adapter",
                                   "elm327-v1.5", "--fault", "wait=300"}};
    std::string m_adapter = m_simulator.readLine();
};

TEST_F(Visits, ASecondOneTriesTheBusOfTheFirstUntilThatIsForgotten)
{
    e2e::Outcome const first = visit({});
    EXPECT_THAT(trace(), HasSubstr("ATTP0"));
    EXPECT_THAT(first.err, HasSubstr("The adapter's wait for replies was shortened to 102 ms"));
    EXPECT_THAT(first.err, HasSubstr("The adapter does not keep to that; its wait was ended"));
    EXPECT_THAT(first.err, HasSubstr("The adapter's habits: "));
    EXPECT_THAT(trace(), Not(HasSubstr("ATLP"))) << "a sleeping adapter would cost the next visit";
    e2e::Outcome const second = visit({});
    EXPECT_THAT(trace(), HasSubstr("ATTP6"));
    EXPECT_THAT(trace(), Not(HasSubstr("ATTP0")));
    EXPECT_LT(trace().find("ATST19"), trace().find("ATTP6")) << "so does the wait that it was brought to";
    EXPECT_EQ(second.out, first.out);
    e2e::Outcome const third = visit({"--forget", "--sleep"});
    EXPECT_THAT(trace(), HasSubstr("ATTP0"));
    EXPECT_THAT(trace(), HasSubstr("ATLP"));
    EXPECT_EQ(third.out, first.out);
}

} // namespace
