// What commands say of a vehicle that has not, or refuses, what is asked for: text, error, hints and exit code.
#include "tests/program/commandrun.h"

namespace {

using namespace velmora::cli;
using testing::HasSubstr;
using testing::StartsWith;

constexpr char const* silentHints = "  - is the ignition still on?\n"
                                    "  - some vehicles answer only with the engine running, or only with it off\n"
                                    "  - a control module that does not offer it may stay silent, too\n";

TEST_F(CommandRun, WhatAVehicleDoesNotAnswerIsToldAndAnError)
{
    std::string const silent = std::string("velmora: The vehicle did not answer this\n") + silentHints;
    std::string const module = "Control module 7E8: ECU#1\n";
    expect({
        {"@B counters", 5, module + "  Counters       no answer\n", silent},
        {"@B monitors", 5, module + "  Monitor tests  no answer\n", silent},
        {"@B freeze 3", 5, module + "  Freeze frame   3: no answer\n", silent},
        {"@B readiness", 6, module + "  Readiness      not supported\n",
         "velmora: No control module reports its readiness\n"
         "  - some gearboxes and brakes don't; leave --ecu out to ask all\n"},
        {"@B oxygen", 6, module + "  Oxygen monitor not supported\n",
         "velmora: No control module reports oxygen sensors\n  - diesel engines have none, or don't report them\n"},
        {"@B codes --permanent", 6, module + "  Lamp           -\n  Permanent      no answer\n",
         "velmora: No control module reported these codes\n  - is the ignition on?\n"
         "  - not all vehicles report pending codes, and only newer ones permanent codes\n"},
        {"@B codes --uds", 5, module + "  service 19 is not answered\n",
         "velmora: No control module answered service 19 or 18\n"
         "  - `velmora codes` asks the way that every OBD vehicle knows\n"},
        {"@B -y clear", 5, "Control module 7E8 ECU#1: no answer\n",
         "velmora: No control module confirmed that it cleared its codes\n  - is the ignition still on?\n"
         "  - read the codes to see what is stored now\n"},
        {"@B scan --check --no-history", 1, "Adapter\n  Device         ELM327 v1.5\n",
         "velmora: Nothing was found, but not all was told: 7E8 confirmed codes\n  - is the ignition on?\n"
         "  - try again: a reply may have been lost on the bus\n"},
        {"@B --ecu 7E9 info", 6, "", "velmora: The vehicle has no control module 7E9\n  - these answer: 7E8\n"},
    });
}

TEST_F(CommandRun, WhatAVehicleRefusesIsToldAndAnError)
{
    std::string const module = "Control module 7E8: ECU#1\n";
    expect({
        {"@R codes --pending", 7, module + "  Lamp           -\n  Pending        refused: service not supported (11)\n",
         "velmora: The vehicle refused to report these codes\n"
         "  - try again with the ignition on and the engine off\n"},
        {"@R -y clear", 7, "Control module 7E8 ECU#1: refused: conditions not correct (22)\n",
         "velmora: Control module 7E8 refused to clear its codes: conditions not correct (22)\n"
         "  - most modules clear only with the ignition on and the engine off\n"},
        {"@R -y routines --run 01", 7,
         module + "  Routine 01     Evaporative system leak test\n"
                  "  Result         refused: conditions not correct (22)\n",
         "velmora: The vehicle refused to run routine 01: conditions not correct (22)\n"
         "  - the vehicle decides when a routine may run; its maker's documents state the conditions\n"},
        {"@R monitors", 6, module + "  Monitor tests  not supported\n",
         "velmora: No control module offers monitor test results\n"
         "  - older vehicles may have oxygen sensor tests only: velmora oxygen\n"},
        {"@R counters", 6, module + "  Counters       not supported\n",
         "velmora: No control module keeps in-use counters\n  - vehicles before about 2008 have none\n"},
        {"@R -y routines --run 02", 6, "",
         "velmora: No control module offers a known routine 02\n"
         "  - `velmora routines` lists those that can be run\n"},
        {"@R freeze", 0, module + "  Freeze frame   0: none stored\n", ""},
        {"@R scan --check --no-history", 10, "Adapter\n", ""},
    });
}

TEST_F(CommandRun, ValuesComeInLinesOrJson)
{
    EXPECT_TRUE(std::regex_match(run("@B live -n 2 RPM SPEED").out,
                                 std::regex("(Engine RPM: \\d+ rpm\nVehicle Speed Sensor: 0 km/h\n){2}")));
    EXPECT_EQ(run("@B -u imperial live -n 1 SPEED").out, "Vehicle Speed Sensor: 0 mph\n");
    EXPECT_THAT(
        run("@B --json live -n 1 SPEED").out,
        HasSubstr("\"module\":\"7E8\",\"pid\":\"0D\",\"uid\":130,\"name\":\"Vehicle Speed Sensor\",\"value\":0,"));
    std::string const file = m_folder.file("a.csv");
    EXPECT_EQ(run("@B live -n 2 SPEED --csv " + file).code, ExitCode::Done);
    std::ifstream in(file);
    std::vector<std::string> lines;
    for (std::string line; std::getline(in, line);) {
        lines.push_back(line.substr(line.find(',')));
    }
    EXPECT_EQ(lines, (std::vector<std::string>{",Vehicle Speed Sensor (km/h)", ",0", ",0"}));
}

// A round more of sensors that are read every ten seconds would take as long.
TEST_F(CommandRun, AsManyReadingsAsWishedTakeNoLonger)
{
    auto const start = std::chrono::steady_clock::now();
    EXPECT_EQ(run("@B live -n 1 SPEED --rate 0.1").out, "Vehicle Speed Sensor: 0 km/h\n");
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(5));
}

// What a person reads on a terminal, where both ends of the program come together.
TEST_F(CommandRun, WhatIsToldStandsBehindWhatWasPrintedBefore)
{
    std::ofstream(m_folder.file("half.toml"))
        << "name = \"Half\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\nlive = \"0C\"\n"
           "raw = { \"0100\" = \"41 00 00 18 00 00\" }\n";
    for (auto const& [line, printed, told] :
         {std::tuple{"@B counters", "  Counters       no answer\n", "velmora: "},
          std::tuple{"@B codes --uds", "  service 19 is not answered\n", "velmora: "},
          std::tuple{"@B -y clear", "Control module 7E8 ECU#1: no answer\n", "velmora: "},
          std::tuple{"dtc P0420 X0", "P0420  Generic", "velmora: "},
          std::tuple{"@B scan --check --no-history", "Adapter\n", "velmora: "},
          std::tuple{"-p sim:@F/half.toml?instant live --duration 0.1 RPM SPEED", "Engine RPM: ", "No value came of: "},
          std::tuple{
              "-q -p sim:petrol-can11-modules?instant signals probe --module 743 --reply 763 --from F187 --to F187 "
              "-o @F/order.toml",
              "  F187  3238", "1 signal in "}}) {
        std::string const path = m_folder.file("both");
        std::fflush(stdout);
        {
            int const both = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_APPEND | O_CLOEXEC, 0600);
            Replaced const output(STDOUT_FILENO, both);
            Replaced const error(STDERR_FILENO, both);
            ::close(both);
            runMain(meant(line));
        }
        std::string const said = m_folder.read("both");
        ASSERT_NE(said.find(told), std::string::npos) << said;
        EXPECT_LT(said.find(printed), said.find(told)) << said;
    }
}

} // namespace
