// The program as a user runs it: against simulated and recorded cars, in real time.

#include "tests/e2e/childprocess.h"
#include "tests/support/json/jsonschema.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <sys/wait.h>
#include <thread>

namespace {

using e2e::ChildProcess;
using e2e::Outcome;
using e2e::runVelmora;

std::string recorded(std::string const& name)
{
    return std::string("replay:") + VELMORA_SOURCE_DIR + "/tests/dialogues/" + name + ".dialogue";
}

bool holds(std::string const& text, std::string const& part)
{
    return text.find(part) != std::string::npos;
}

TEST(Program, TellsItsVersionAndHelp)
{
    EXPECT_TRUE(runVelmora({"--version"}).out.starts_with("velmora "));
    Outcome const help = runVelmora({"--help"});
    EXPECT_EQ(help.exitCode, 0);
    for (char const* word : {"scan", "console", "simulate", "ports", "--port", "Exit codes"}) {
        EXPECT_TRUE(holds(help.out, word)) << word;
    }
}

TEST(Program, WrongUseIsExitCodeTwoAndSaysWhatToDo)
{
    for (std::vector<std::string> const& wrong : {std::vector<std::string>{},
                                                  {"nonsense"},
                                                  {"-P", "10", "scan"},
                                                  {"--ecu", "XYZ", "scan"},
                                                  {"-u", "old", "scan"},
                                                  {"-p", "ftp://x", "scan"},
                                                  {"--baud", "0", "scan"}}) {
        Outcome const outcome = runVelmora(wrong);
        EXPECT_EQ(outcome.exitCode, 2) << outcome.err;
        EXPECT_TRUE(outcome.err.starts_with("velmora: ")) << outcome.err;
        EXPECT_TRUE(holds(outcome.err, "\n  - ")) << outcome.err;
        EXPECT_TRUE(outcome.out.empty());
    }
}

TEST(Program, PortThatDoesNotExistIsExitCodeThree)
{
    for (char const* port : {"/dev/no-such-port", "127.0.0.1:1", "/dev/null", "/tmp", "sim:no-such-car", "sim:/",
                             "replay:/no/such/file", "replay:/"}) {
        Outcome const outcome = runVelmora({"-p", port, "scan"});
        EXPECT_EQ(outcome.exitCode, 3) << port << outcome.err;
        EXPECT_TRUE(holds(outcome.err, "\n  - ")) << port << outcome.err;
    }
}

TEST(Program, SettingsFileThatIsBrokenIsToldWithItsLine)
{
    std::string const file = testsupport::ownPath("broken.toml");
    FILE* const out = std::fopen(file.c_str(), "w");
    ASSERT_NE(out, nullptr);
    std::fputs("[common]\nunitsystem = \n", out);
    std::fclose(out);
    Outcome const outcome = runVelmora({"-p", "sim:", "--settings", file, "scan"});
    EXPECT_EQ(outcome.exitCode, 1);
    EXPECT_TRUE(holds(outcome.err, "line 2")) << outcome.err;
    std::remove(file.c_str());
}

TEST(Program, FileThatCantBeWrittenIsExitCodeOneAndTold)
{
    for (char const* option : {"--log", "--trace"}) {
        Outcome const outcome = runVelmora({"-p", "sim:", option, "/no/such/folder/file", "info"});
        EXPECT_EQ(outcome.exitCode, 1) << option;
        EXPECT_TRUE(holds(outcome.err, "/no/such/folder/file: No such file or directory\n  - ")) << outcome.err;
    }
}

TEST(Program, OutputThatCantBeWrittenIsExitCodeOne)
{
    for (std::string const arguments : {"dtc P0420", "dtc --dump", "--help"}) {
        std::string const command = VELMORA_PROGRAM " " + arguments + " > /dev/full 2>&1";
        EXPECT_EQ(WEXITSTATUS(std::system(command.c_str())), 1) << arguments;
    }
}

TEST(Program, SilentAdapterIsExitCodeFour)
{
    ChildProcess simulator({"simulate", "--listen", "tcp://127.0.0.1:0", "--adapter", "silent"});
    Outcome const outcome = runVelmora({"-q", "-p", simulator.readLine(), "scan"});
    EXPECT_EQ(outcome.exitCode, 4) << outcome.err;
}

TEST(Program, RecordedCarWithoutAnAnswerIsExitCodeFive)
{
    Outcome const outcome = runVelmora({"-q", "-P", "6", "-p", recorded("can11-leaf-2011-no-data"), "scan"});
    EXPECT_EQ(outcome.exitCode, 5) << outcome.err;
    EXPECT_TRUE(holds(outcome.err, "ignition")) << outcome.err;
}

TEST(Program, ScansARecordedRealCarOverTcp)
{
    ChildProcess simulator({"simulate", "--listen", "tcp://127.0.0.1:0", "--replay",
                            recorded("can11-a180d-three-modules").substr(std::string("replay:").size())});
    Outcome const outcome = runVelmora({"-q", "-p", simulator.readLine(), "scan", "--json"});
    ASSERT_EQ(outcome.exitCode, 0) << outcome.err;
    support::expectValid(outcome.out, "scan");
    auto const report = nlohmann::json::parse(outcome.out);
    EXPECT_EQ(report["adapter"]["device"], "ELM327 v1.5");
    EXPECT_EQ(report["adapter"]["description"], "ICSolution");
    EXPECT_EQ(report["protocol"]["number"], 6);
    ASSERT_EQ(report["modules"].size(), 3U);
    EXPECT_EQ(report["modules"][0]["id"], "7E8");
    EXPECT_EQ(report["modules"][2]["id"], "7EB");
    // 98 18 00 01 and 80 01 80 01 without readiness and masks, then what is derived from them.
    EXPECT_EQ(report["modules"][2]["sensors"],
              (std::vector<std::string>{"04", "05", "0C", "0D", "21", "30", "31", "F4", "F5", "F6"}));
}

TEST(Program, ReadsTheControlModuleThatIsAskedFor)
{
    Outcome const second = runVelmora({"-q", "-p", "sim:petrol-can11?instant", "--ecu", "0x7e9", "info"});
    EXPECT_EQ(second.exitCode, 0) << second.err;
    EXPECT_TRUE(second.out.starts_with("Control module 7E9: TCM\n")) << second.out;
    EXPECT_FALSE(holds(second.out, "7E8")) << second.out;
    Outcome const none = runVelmora({"-q", "-p", "sim:petrol-can11?instant", "--ecu", "7EA", "info"});
    EXPECT_EQ(none.exitCode, 6);
    EXPECT_TRUE(holds(none.err, "no control module 7EA\n  - these answer: 7E8, 7E9\n")) << none.err;
}

TEST(Program, ReadsARecordedRealCarLive)
{
    std::string const car = recorded("can11-jaguar-2014-two-modules-come-and-go");
    Outcome const inProcess = runVelmora({"-q", "-p", car, "live", "RPM", "SPEED", "COOLANT_TEMP", "-n", "2"});
    EXPECT_EQ(inProcess.exitCode, 0) << inProcess.err;
    ChildProcess simulator({"simulate", "--listen", "tcp://127.0.0.1:0", "--replay", car.substr(7)});
    Outcome const overTcp =
        runVelmora({"-q", "-p", simulator.readLine(), "live", "RPM", "SPEED", "COOLANT_TEMP", "-n", "2"});
    EXPECT_EQ(overTcp.exitCode, 0) << overTcp.err;
    for (Outcome const& outcome : {inProcess, overTcp}) {
        // The first module is silent to it; the second's is the one that is shown, and no 0 for the first.
        EXPECT_TRUE(holds(outcome.out, "Engine RPM: 729 rpm\n")) << outcome.out;
        EXPECT_FALSE(holds(outcome.out, "Engine RPM: 0 rpm\n")) << outcome.out;
        EXPECT_TRUE(holds(outcome.out, "Vehicle Speed Sensor: 0 km/h\n")) << outcome.out;
        EXPECT_TRUE(holds(outcome.out, "Engine Coolant Temperature: 76 °C\n")) << outcome.out;
    }
}

TEST(Program, ScansASimulatedCarOverAPseudoTerminal)
{
    ChildProcess simulator({"simulate", "--listen", "pty", "--vehicle", "petrol-kwp-fast"});
    Outcome const outcome = runVelmora({"-q", "-p", simulator.readLine(), "scan"});
    ASSERT_EQ(outcome.exitCode, 0) << outcome.err;
    EXPECT_TRUE(holds(outcome.out, "ISO 14230-4")) << outcome.out;
    EXPECT_TRUE(outcome.err.empty()) << outcome.err;
}

TEST(Program, ConsoleShowsTheLinesAsTheyCame)
{
    std::string const commands = "ATI\r\n\r\nNONSENSE\r\nATDP\r\nexit\r\nATI\r\n"; // line ends of another system
    Outcome const outcome = runVelmora({"-q", "-p", "sim:petrol-can11?instant", "console"}, commands);
    ASSERT_EQ(outcome.exitCode, 0) << outcome.err;
    EXPECT_EQ(outcome.out, "ELM327 v1.5\n?\nAUTO\n") << "nothing was asked of the vehicle before";
    Outcome const json =
        runVelmora({"-q", "--json", "-p", "sim:petrol-can11?instant", "console"}, "AT Z\nNOPE"); // no end
    EXPECT_EQ(json.exitCode, 0) << json.err;
    EXPECT_EQ(json.out, "{\"command\":\"AT Z\",\"answered\":true,\"lines\":[\"ELM327 v1.5\"]}\n"
                        "{\"command\":\"NOPE\",\"answered\":true,\"lines\":[\"?\"]}\n");
}

TEST(Program, FullDiskUnderTraceAndLogIsToldOnce)
{
    for (char const* option : {"--trace", "--log"}) {
        Outcome const outcome = runVelmora({"-q", "-p", "sim:petrol-can11?instant", option, "/dev/full", "info"});
        EXPECT_EQ(outcome.exitCode, 1) << option;
        EXPECT_TRUE(holds(outcome.out, "VIN")) << "the command does its work all the same";
        EXPECT_EQ(std::count(outcome.err.begin(), outcome.err.end(), '\n'), 1) << outcome.err;
        EXPECT_TRUE(holds(outcome.err, "/dev/full")) << outcome.err;
    }
}

// The user has redirected a stream and named no file.
TEST(Program, WhatStandardErrorIsRedirectedToIsNeverTruncated)
{
    std::string const file = testsupport::ownPath("day.log");
    for (std::string const option :
         {"-q -p sim:petrol-can11?instant info --trace", "-q -p sim:petrol-can11?instant info --log",
          "simulate --listen tcp://256.1.1.1:1 --trace"}) {
        std::ofstream(file) << "yesterday\n";
        std::string const command = VELMORA_PROGRAM " " + option + " /dev/stderr >/dev/null 2>>" + file;
        std::system(command.c_str());
        std::ifstream in(file);
        std::string const text{std::istreambuf_iterator<char>(in), {}};
        EXPECT_TRUE(text.starts_with("yesterday\n")) << option << text.substr(0, 80);
        EXPECT_GT(text.size(), 30U) << option;
    }
    std::remove(file.c_str());
}

TEST(Program, InterruptEndsWithinASecond)
{
    ChildProcess simulator({"simulate", "--listen", "tcp://127.0.0.1:0", "--adapter", "silent"});
    ChildProcess scan({"-q", "-p", simulator.readLine(), "scan"});
    std::this_thread::sleep_for(std::chrono::milliseconds(300));
    auto const start = std::chrono::steady_clock::now();
    scan.interrupt();
    EXPECT_EQ(scan.wait(), 130);
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(1));
}

TEST(Program, LinkThatBreaksWhileConnectingIsExitCodeEight)
{
    ChildProcess simulator({"simulate", "--listen", "tcp://127.0.0.1:0", "--fault", "loss@60"});
    Outcome const outcome = runVelmora({"-q", "-p", simulator.readLine(), "scan"});
    EXPECT_EQ(outcome.exitCode, 8) << outcome.err;
}

// The port takes what simulate takes.
TEST(Program, SimulatedPortHasTheSimulatorsOptions)
{
    std::string const scenario = testsupport::ownPath("port.scenario");
    std::ofstream(scenario) << "0 voltage 11.8\n";
    Outcome const outcome = runVelmora(
        {"-q", "-p", "sim:petrol-can11?instant&adapter=stn2120&fault=error:BUS BUSY@4&scenario=" + scenario, "console"},
        "ATE0\nSTI\nATRV\nATI\n");
    EXPECT_EQ(outcome.out, "OK\nSTN2120 v5.8.1\n11.8V\nBUS BUSY\n") << outcome.err;
    std::remove(scenario.c_str());
    for (char const* wrong : {"drive=uphill", "adapter=none", "scenario=/no/such/file", "fault=fire@3"}) {
        Outcome const refused = runVelmora({"-p", std::string("sim:petrol-can11?") + wrong, "info"});
        EXPECT_EQ(refused.exitCode, 3) << wrong << refused.err;
        EXPECT_TRUE(holds(refused.err, "simulate --list")) << refused.err;
    }
    EXPECT_EQ(runVelmora({"-p", "sim:petrol-can11?speed=3", "info"}).exitCode, 2);
}

TEST(Program, WrongSimulatorOptionsAreExitCodeTwo)
{
    for (std::vector<std::string> const& wrong : {std::vector<std::string>{"simulate", "--fault", "nonsense"},
                                                  {"simulate", "--adapter", "none"},
                                                  {"simulate", "--vehicle", "none"},
                                                  {"simulate", "--listen", "sim:x"}}) {
        EXPECT_EQ(runVelmora(wrong).exitCode, 2);
    }
}

} // namespace
