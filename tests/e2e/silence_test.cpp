// What is told of vehicles and adapters that fall silent, at the pace at which a person meets it.

#include "tests/e2e/childprocess.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <fstream>
#include <future>

namespace {

using e2e::Outcome;
using e2e::runOnTerminal;
using e2e::runVelmora;

class Silence : public testing::Test
{
protected:
    Silence()
    {
        std::ofstream(m_folder.file("half.toml")) << "name = \"Half\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\nlive = "
                                                     "\"0C\"\nraw = { \"0100\" = \"41 00 00 18 00 00\" }\n";
        std::ofstream(m_folder.file("falling")) << "3 module 7E8 silent\n";
        std::ofstream(m_folder.file("waking")) << "3 module 7E8 silent\n7 module 7E8 speaks\n12 module 7E8 silent\n";
    }
    // A car that claims to have the speed, and tells the engine speed alone.
    std::vector<std::string> half(std::vector<std::string> const& rest, std::string const& more = "instant") const
    {
        std::vector<std::string> all = {"-p", "sim:" + m_folder.file("half.toml") + "?" + more};
        all.insert(all.end(), rest.begin(), rest.end());
        return all;
    }
    // All of them wait, so they wait together.
    static std::future<Outcome> begin(std::vector<std::string> const& arguments, std::string const& input = {})
    {
        return std::async(std::launch::async, runVelmora, arguments, input);
    }

    testsupport::TemporaryFolder const m_folder;
};

std::size_t timesIn(std::string const& text, std::string const& part)
{
    std::size_t count = 0;
    for (std::size_t at = text.find(part); at != std::string::npos; at = text.find(part, at + 1)) {
        ++count;
    }
    return count;
}

TEST_F(Silence, IsToldAndEndsWhatCannotBeDone)
{
    std::string const still = "No values come from the vehicle; still asking. Is the ignition on?\n";
    auto waking = begin(half({"live", "RPM", "--duration", "16"}, "scenario=" + m_folder.file("waking")));
    auto quiet = begin(half({"-q", "live", "RPM", "--duration", "20"}, "scenario=" + m_folder.file("falling")));
    auto falling = begin(half({"live", "RPM", "-n", "100000"}, "scenario=" + m_folder.file("falling")));
    auto never = begin(half({"live", "SPEED", "-n", "1"}));
    auto console = begin(half({"-q", "console"}, "instant&adapter=silent"), "ATI\n");
    auto old = std::async(std::launch::async, [&] {
        return runOnTerminal(half({"-q", "live", "RPM"}, "scenario=" + m_folder.file("falling")), "", " s ago", "q");
    });
    Outcome const screen = runOnTerminal(half({"-q", "live", "SPEED"}), "", "No answer from the vehicle", "q");
    EXPECT_EQ(old.get().exitCode, 0) << "a value that is gone tells its age";
    EXPECT_EQ(screen.exitCode, 0) << screen.out;

    Outcome const woken = waking.get();
    EXPECT_EQ(woken.exitCode, 0) << woken.err;
    EXPECT_EQ(timesIn(woken.err, still), 2U) << "once for each silence: " << woken.err;
    EXPECT_EQ(quiet.get().err, "");

    Outcome const fallen = falling.get();
    EXPECT_EQ(fallen.exitCode, 5) << fallen.err;
    EXPECT_EQ(timesIn(fallen.err, still), 1U) << fallen.err;
    EXPECT_TRUE(fallen.err.ends_with("velmora: The vehicle no longer answers\n  - is the ignition still on?\n"))
        << fallen.err;
    EXPECT_GT(timesIn(fallen.out, "Engine RPM: "), 3U) << "what came before";

    Outcome const silent = never.get();
    EXPECT_EQ(silent.exitCode, 5) << silent.err;
    EXPECT_TRUE(
        silent.err.ends_with("velmora: The vehicle gives none of the chosen values\n  - is the ignition still on?\n"))
        << silent.err;
    EXPECT_EQ(silent.out, "");

    Outcome const asked = console.get();
    EXPECT_EQ(asked.exitCode, 4) << asked.err;
    EXPECT_TRUE(asked.err.starts_with("(no answer)\nvelmora: Nothing on sim:")) << asked.err;
    EXPECT_NE(asked.err.find(" answered any command\n  - is it the right port, and the right --baud?\n"),
              std::string::npos)
        << asked.err;
}

} // namespace
