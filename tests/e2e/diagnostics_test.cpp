// The diagnostic results as a user reads them, of simulated cars on CAN and on a legacy bus.

#include "tests/e2e/childprocess.h"
#include "tests/support/json/jsonschema.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <cstdio>
#include <fstream>

namespace {

using e2e::Outcome;
using e2e::runVelmora;
using support::expectValid;

bool holds(std::string const& text, std::string const& part)
{
    return text.find(part) != std::string::npos;
}

nlohmann::json runJson(std::string const& car, std::string const& command)
{
    Outcome const outcome = runVelmora({"-q", "-p", "sim:" + car + "?instant", "--json", command});
    EXPECT_EQ(outcome.exitCode, 0) << outcome.err;
    expectValid(outcome.out, command);
    return nlohmann::json::parse(outcome.out, nullptr, false);
}

TEST(Diagnostics, ReadinessTellsWhatIsNotComplete)
{
    auto const modules = runJson("petrol-can11", "readiness");
    EXPECT_EQ(modules[0]["ready"], false);
    EXPECT_EQ(modules[0]["notComplete"], 2);
    EXPECT_EQ(modules[0]["monitors"][0], nlohmann::json::parse(R"({"name": "Evaporative System",
        "sinceCleared": "not complete", "thisCycle": "disabled this cycle"})"));
    EXPECT_EQ(modules[1]["ready"], true);
}

TEST(Diagnostics, MonitorTestsOnCanHaveValueLimitsAndVerdict)
{
    auto const modules = runJson("petrol-can11", "monitors");
    auto const& first = modules[0]["monitors"][0];
    EXPECT_EQ(first["id"], "01");
    EXPECT_EQ(first["tests"][0]["id"], "05"); // failed: 96 ms, at most 80
    EXPECT_EQ(first["tests"][0]["result"], "failed");
    EXPECT_EQ(first["tests"][1]["result"], "passed");
    EXPECT_EQ(modules[1]["answer"], "no answer") << "it is silent to 06 00, and that is all that is known";
}

TEST(Diagnostics, OxygenTestsOfAnOlderBusStandBySensor)
{
    auto const modules = runJson("petrol-iso9141", "oxygen");
    EXPECT_EQ(modules[0]["complete"], true);
    auto const& sensors = modules[0]["sensors"];
    ASSERT_EQ(sensors.size(), 2U);
    EXPECT_EQ(sensors[0]["tests"].size(), 4U);
    EXPECT_EQ(sensors[0]["tests"][0]["id"], "05");
    EXPECT_EQ(sensors[0]["tests"][0]["result"], "passed");
    EXPECT_TRUE(sensors[0]["tests"][3]["result"].is_null()); // a constant
}

TEST(Diagnostics, CountersAndInformationAreThoseOfTheCar)
{
    auto const counters = runJson("petrol-can11", "counters")[0]["counters"];
    EXPECT_EQ(counters[0]["value"], 412);
    EXPECT_EQ(counters[1]["value"], 655);
    auto const info = runJson("petrol-can11", "info")[0];
    EXPECT_EQ(info["vin"], "VELMRAS1MM0000001");
    EXPECT_EQ(info["calibrations"], nlohmann::json::parse(R"([{"id": "VS16-MT-0420", "verification": "1791BC82"}])"));
    EXPECT_TRUE(info["engineSerialNumber"].is_null());
    EXPECT_FALSE(info["sinceCleared"]["distance"].is_null());
}

// The engine module of that car asks for time before it tells the VIN.
TEST(Diagnostics, ReadsWhatAModuleOnAKLineAsksTimeFor)
{
    EXPECT_EQ(runJson("petrol-kwp-fast", "info")[0]["vin"], "VELMRAK1M70000004");
}

TEST(Diagnostics, AModuleThatRefusesToTellWhatItHasIsToldSo)
{
    std::string const file = testsupport::ownPath("refusing.toml");
    std::ofstream(file) << "name = 'refuses'\nprotocol = 6\n[[module]]\nid = '7E8'\nlive = '0C'\n"
                           "[[module]]\nid = '7E9'\n[module.raw]\n'0100' = '7F 01 22'\n";
    Outcome const outcome = runVelmora({"-q", "-p", "sim:" + file + "?instant", "sensors"});
    std::size_t const second = outcome.out.find("Control module 7E9");
    ASSERT_NE(second, std::string::npos) << outcome.out;
    EXPECT_FALSE(holds(outcome.out.substr(0, second), "refused")) << outcome.out;
    EXPECT_TRUE(holds(outcome.out.substr(second), "F6 (not known in full: refused)\n")) << outcome.out;
    auto const json =
        nlohmann::json::parse(runVelmora({"-q", "--json", "-p", "sim:" + file + "?instant", "sensors"}).out);
    EXPECT_EQ(json[0]["answers"]["01"], "read");
    EXPECT_EQ(json[0]["answers"]["06"], "no answer");
    EXPECT_EQ(json[1]["answers"]["01"], "refused");
    std::remove(file.c_str());
}

TEST(Diagnostics, MonitorsOfWhichSomeMayNotHaveBeenReadAreToldSo)
{
    std::string const file = testsupport::ownPath("lostmask.toml");
    std::string const car = "name = 'lost'\nprotocol = 6\n[[module]]\nid = '7E8'\nlive = '0C'\n[module.raw]\n"
                            "'0601' = '46 01 01 0B 01 C2 01 90 01 F4'\n";
    for (auto const& [mask, answer] : {std::pair{"'0600' = '46 00 80 00 00 01'\n", "no answer"},
                                       std::pair{"'0600' = '46 00 80 00 00 00'\n", "read"}}) {
        std::ofstream(file) << car << mask;
        Outcome const outcome = runVelmora({"-q", "--json", "-p", "sim:" + file + "?instant", "scan"});
        auto const report = nlohmann::json::parse(outcome.out);
        EXPECT_EQ(report["modules"][0]["monitors"]["answer"], "read") << outcome.out;
        EXPECT_EQ(report["modules"][0]["supported"], answer);
        EXPECT_EQ(holds(outcome.out, "all that it supports (no answer)"), std::string(answer) == "no answer");
    }
    std::remove(file.c_str());
}

TEST(Diagnostics, WhatNoModuleOffersIsExitCodeSix)
{
    Outcome const outcome = runVelmora({"-q", "-p", "sim:petrol-iso9141?instant", "counters"});
    EXPECT_EQ(outcome.exitCode, 6);
    EXPECT_TRUE(holds(outcome.out, "Counters       not supported\n")) << outcome.out;
    EXPECT_TRUE(holds(outcome.err, "in-use counters")) << outcome.err;
}

TEST(Diagnostics, RoutineRunsOnlyWhenConfirmedAndOffered)
{
    Outcome const unasked = runVelmora({"-q", "-p", "sim:petrol-can11?instant", "routines", "--run", "01"});
    EXPECT_EQ(unasked.exitCode, 2);
    EXPECT_TRUE(holds(unasked.err, "--yes")) << unasked.err;
    EXPECT_EQ(runVelmora({"-q", "-y", "-p", "sim:petrol-can11?instant", "routines", "--run", "100"}).exitCode, 2);
    Outcome const unknown = runVelmora({"-q", "-y", "-p", "sim:petrol-can11?instant", "routines", "--run", "03"});
    EXPECT_EQ(unknown.exitCode, 6) << unknown.err;
    EXPECT_TRUE(unknown.out.empty()) << unknown.out;
}

TEST(Diagnostics, RoutineThatRunsIsAccepted)
{
    auto const routines = runJson("petrol-can11", "routines");
    EXPECT_EQ(routines[0]["routines"][0]["name"], "Evaporative system leak test");
    Outcome const run =
        runVelmora({"-q", "-y", "--json", "-p", "sim:petrol-can11?instant", "routines", "--run", "0x01"});
    EXPECT_EQ(run.exitCode, 0) << run.err;
    expectValid(run.out, "routinesRun");
    EXPECT_TRUE(holds(run.out, "\"accepted\"")) << run.out;
}

TEST(Diagnostics, RoutineThatIsRefusedIsExitCodeSevenWithItsReason)
{
    Outcome const run = runVelmora({"-q", "-y", "-p", "sim:petrol-can11?instant", "routines", "--run", "02"});
    EXPECT_EQ(run.exitCode, 7) << run.err;
    EXPECT_TRUE(holds(run.out, "Result         refused: conditions not correct (22)\n")) << run.out;
    EXPECT_TRUE(holds(run.err, "refused to run routine 02: conditions not correct")) << run.err;
}

} // namespace
