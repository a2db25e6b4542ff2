// What the commands print with --json, against docs/json.schema.json; those that other tests here don't hold against
// it.

#include "tests/e2e/childprocess.h"
#include "tests/support/json/jsonschema.h"

#include <gtest/gtest.h>

namespace {

using e2e::Outcome;
using e2e::runVelmora;
using support::expectValid;

std::string run(std::string const& car, std::vector<std::string> const& command)
{
    std::vector<std::string> arguments = {"-q", "--json", "-p", "sim:" + car + "?instant"};
    arguments.insert(arguments.end(), command.begin(), command.end());
    return runVelmora(arguments).out;
}

TEST(JsonSchema, HoldsForCommandsWithoutAVehicle)
{
    expectValid(runVelmora({"--json", "ports", "--known"}).out, "ports");
    expectValid(runVelmora({"--json", "dtc", "P0420", "P1000"}).out, "dtc");
    expectValid(runVelmora({"--json", "vin", "1M8GDM9AXKP042788"}).out, "vin");
    expectValid(runVelmora({"--json", "vin", "TM9ZZZ1Z000000001"}).out, "vin");
    expectValid(runVelmora({"--json", "--settings", "/no/such/file", "settings"}).out, "settings");
    expectValid(runVelmora({"--json", "--settings", "/no/such/file", "settings", "weight"}).out, "setting");
    expectValid(runVelmora({"--json", "dtc", "--search", "catalyst"}).out, "dtcRows");
}

TEST(JsonSchema, HoldsForTheModulesOfACar)
{
    expectValid(run("petrol-can11", {"scan"}), "scan");
    expectValid(run("petrol-can11", {"sensors"}), "sensors");
    expectValid(run("petrol-can11", {"freeze"}), "freeze");
    expectValid(run("diesel-can29", {"-y", "clear"}), "clear");
}

TEST(JsonSchema, HoldsForEveryLineOfLive)
{
    std::string const lines = run("petrol-can11", {"live", "RPM", "03", "-n", "2"});
    std::size_t begin = 0;
    int count = 0;
    while (begin < lines.size()) {
        std::size_t const end = lines.find('\n', begin);
        ASSERT_NE(end, std::string::npos) << lines;
        expectValid(lines.substr(begin, end - begin), "live");
        begin = end + 1;
        ++count;
    }
    EXPECT_GE(count, 4);
}

} // namespace
