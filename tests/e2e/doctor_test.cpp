// What the doctor measures of an adapter in real time, against what such an adapter can do by its own figures.

#include "tests/e2e/childprocess.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace {

using e2e::ChildProcess;
using e2e::Outcome;
using e2e::runVelmora;

// At 38400 baud, a module that answers in 10 ms.
nlohmann::json figuresOf(std::vector<std::string> const& faults)
{
    std::vector<std::string> arguments{"simulate",    "--listen",  "tcp://127.0.0.1:0", "--vehicle",
                                       "bench-can11", "--adapter", "elm327-v1.5",       "--fault",
                                       "command=0",   "--fault",   "baud=38400"};
    for (std::string const& fault : faults) {
        arguments.insert(arguments.end(), {"--fault", fault});
    }
    ChildProcess simulator(arguments);
    Outcome const outcome = runVelmora({"-q", "-p", simulator.readLine(), "--json", "doctor"});
    EXPECT_EQ(outcome.exitCode, 0) << outcome.err;
    return nlohmann::json::parse(outcome.out)["figures"];
}

// Upper limits are what no adapter of that kind can pass, however fast this machine is; lower ones are far below what
// it does on a busy machine, and above what fewer PIDs or no count would give.
TEST(DoctorRate, IsWhatTheAdapterCanDo)
{
    // The six shortest PIDs in two frames take 16 + 40 + 2 characters of 0.26 ms and the module's 10 ms.
    nlohmann::json const counting = figuresOf({"wait=50"});
    EXPECT_EQ(counting["countWorks"], true) << counting;
    EXPECT_EQ(counting["pidsPerRequest"], 6U);
    EXPECT_LE(counting["valuesPerSecond"].get<double>(), 240.0);
    EXPECT_GE(counting["valuesPerSecond"].get<double>(), 65.0) << "56 with one PID, counted";
    EXPECT_GE(counting["minimum"].get<double>(), 60.0) << "the wait of 50 ms stands behind each plain reply";
    EXPECT_LE(counting["minimum"].get<double>(), counting["median"].get<double>());

    // The same with 100 ms behind each reply, whatever is counted.
    nlohmann::json const ignoring = figuresOf({"wait=100", "quirk:count-ignored"});
    EXPECT_EQ(ignoring["countWorks"], false) << ignoring;
    EXPECT_EQ(ignoring["pidsPerRequest"], 6U);
    EXPECT_LE(ignoring["valuesPerSecond"].get<double>(), 54.0);
    EXPECT_GE(ignoring["valuesPerSecond"].get<double>(), 12.0) << "8 with one PID";
}

} // namespace
