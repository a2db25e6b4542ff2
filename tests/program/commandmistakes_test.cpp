// What commands say of codes, files and wishes that make no sense: error, hints and exit code.
#include "tests/program/commandrun.h"

namespace {

using namespace velmora::cli;
using testing::HasSubstr;
using testing::StartsWith;

TEST_F(CommandRun, CodesAndTheirMakers)
{
    std::string const ways = "  - velmora dtc P0420 explains a code; velmora dtc --search catalyst finds codes\n";
    expect({
        {"dtc", 2, "", "velmora: No code is named\n" + ways},
        {"dtc P0420 --dump", 2, "", "velmora: Codes go neither with --dump nor with --search\n" + ways},
        {"dtc P0420 --search catalyst", 2, "", "velmora: Codes go neither with --dump nor with --search\n" + ways},
        {"dtc X0 P0420 Y1", 2, "P0420  Generic        Catalyst System Efficiency Below Threshold Bank 1\n",
         "velmora: \"X0\", \"Y1\" are no trouble codes\n"
         "  - a trouble code is P, B, C or U, a digit from 0 to 3 and three hexadecimal digits: P0420\n"},
        {"dtc X0", 2, "", "velmora: \"X0\" is no trouble code\n  - "},
        {"dtc --search nosuchword", 1, "",
         "velmora: The catalogue has no such row\n"
         "  - search for fewer words, or the beginnings of words; leave out --make for all makers\n"},
        {"dtc --make Nobody P1131", 2, "",
         "velmora: The catalogue has no maker \"Nobody\"\n  - these it has: Generic, "},
        {"@R codes --make Nobody", 2, "",
         "velmora: The catalogue has no maker \"Nobody\"\n  - these it has: Generic, "},
        {"@R freeze --make Nobody", 2, "",
         "velmora: The catalogue has no maker \"Nobody\"\n  - these it has: Generic, "},
        {"dtc --make Ford P1131", 0,
         "P1131  Ford           O2 Sensor No Activity Detected - Indicates Lean Bank 1 Sensor 1\n", ""},
        {"vin 1M8GDM9AXKP042789", 0, "  VIN            1M8GDM9AXKP042789\n", ""},
        {"vin 123", 2, "", "velmora: \"123\" has 3 characters; a vehicle identification number has 17\n  - count "},
        {"@R -y routines --run 1G", 2, "",
         "velmora: \"1G\" is no routine\n"
         "  - expected a hexadecimal number from 00 to FF; `velmora routines` lists them\n"},
    });
    EXPECT_THAT(run("vin 1M8GDM9AXKP042789").out,
                HasSubstr("  Check digit    wrong: 1 would fit; mistyped or altered\n"));
    EXPECT_THAT(run("--json dtc --make Ford --search lean indicates").out,
                StartsWith("[\n  {\n    \"maker\": \"Ford\",\n"));
    EXPECT_THAT(run("dtc --make Ford --dump").out, StartsWith("Ford\t"));
}

TEST_F(CommandRun, FilesThatAreNotThere)
{
    std::string const none = "velmora: @F/none is no file that can be read\n  - a signal file is a text in TOML; "
                             "`velmora signals import` makes one of a phone app's CSV\n";
    expect({
        {"signals check @F/none", 2, "", none},
        {"signals list @F/none", 2, "", none},
        {"signals import @F/none", 2, "", none},
        {"--signals @F/none @B live -n 1 RPM", 2, "", none},
        {"trips @F/none", 2, "",
         "velmora: There is no file @F/none\n  - name the FILE of watch's output sqlite:FILE\n"},
        {"diff", 2, "", "velmora: Nothing is kept\n  - velmora scan --history keeps a scan\n"},
        {"diff 7", 2, "", "velmora: There is no scan 7 in @F/history.db\n  - velmora history lists those there are\n"},
        {"diff 1 2", 2, "",
         "velmora: There is no scan 1 in @F/history.db\n  - velmora history lists those there are\n"},
        {"history show 3", 2, "",
         "velmora: There is no scan 3 in @F/history.db\n  - velmora history lists those there are\n"},
        {"history import @F/none", 2, "",
         "velmora: Could not read @F/none: there is no such file\n  - velmora history export FILE writes one\n"},
        {"history export @F/no/folder", 1, "",
         "velmora: Could not write @F/no/folder: No such file or directory\n  - does its folder exist?\n"},
        {"live --play @F/none", 1, "",
         "velmora: Could not read @F/none: No such file or directory\n  - is the name right, and may you read it?\n"},
        {"watch --config @F/none", 2, "",
         "velmora: Could not read @F/none: there is no such file\n  - the settings of the watch are a text in TOML\n"},
        {"@B --trace @F/no/folder info", 1, "",
         "velmora: Could not write the trace file @F/no/folder: No such file or directory\n"
         "  - does its folder exist, and may you write there?\n"},
        {"@B --log @F/no/folder info", 1, "",
         "velmora: Could not write the log file @F/no/folder: No such file or directory\n"
         "  - does its folder exist, and may you write there?\n"},
        {"@B scan --report @F/x.pdf --no-history", 2, "",
         "velmora: The ending of @F/x.pdf names no form of a report\n  - known are .html, .md, .json and .txt\n"},
    });
}

TEST_F(CommandRun, WishesThatMakeNoSense)
{
    expect({
        {"settings colour", 2, "",
         "velmora: There is no setting \"colour\"\n  - these there are: units, gallon, displacement, efficiency, "
         "weight, "
         "correction, fuel, ignition\n"},
        {"settings limit.RPM 5..1", 2, "",
         "velmora: \"5..1\" is no limit: no value can meet it\n"
         "  - give the highest value, such as 6000, or a range: 11.8..14.8, 11.8.. or ..14.8\n"},
        {"settings units", 0,
         "Unit system\n  The units that values are shown in. --units chooses for one run.\n  Value          metric\n"
         "  Range          metric or imperial\n  Default        metric\n",
         ""},
        {"live --rate fast RPM", 2, "", "velmora: \"fast\" is no rate of a sensor (\"x@fast\")\n  - a rate is "},
        {"@B live -n 1 COOLANT", 6, "",
         "velmora: The vehicle does not offer the sensor 05 (COOLANT_TEMP)\n"
         "  - `velmora sensors` lists what the vehicle offers\n  - another control module may offer it: --ecu ID\n"},
        {"@B live -n 1 99", 6, "", "velmora: The vehicle does not offer PID 99 ("},
        {"watch --check-config -o csv:@F/a.csv", 0, "", "The settings make sense\n"},
        {"watch -o nonsense", 2, "",
         "velmora: \"nonsense\" is no output: it does not begin with a known kind and a colon\n  - files: csv:FILE, "},
        {"watch --stop-after soon -o csv:@F/a.csv", 2, "",
         "velmora: --stop-after: \"soon\" is not a time such as 120s or 5min\n"},
        {"simulate --listen nowhere", 2, "",
         "velmora: --listen takes tcp://HOST:PORT or pty, not \"nowhere\"\n"
         "  - velmora simulate --list shows what there is to choose from\n"},
        {"simulate --fleet 0", 2, "",
         "velmora: a fleet has 1 to 2000 cars\n  - velmora simulate --list shows what there is to choose from\n"},
        {"simulate --listen tcp://256.1.1.1.1:1", 3, "", "velmora: cannot listen on 256.1.1.1.1:1: "},
        {"simulate --list", 0, "Vehicles:\n  bench-can11\n", ""},
        {"ports pair nonsense", 2, "", "velmora: \"nonsense\" is no port: a Bluetooth address is six pairs of digits"},
        {"ports --known", 0, "",
         "No Bluetooth: The Bluetooth service can't be asked: there is no system bus (No such file or directory)\n"
         "No port that looks like an adapter. A network adapter needs none: --port HOST:PORT\n"},
        {"-y history forget NOBODY", 2, "",
         "velmora: Nothing is kept of NOBODY\n  - velmora history lists the vehicles\n"},
        {"history forget NOBODY", 2, "",
         "velmora: Forgetting must be confirmed, and there is no terminal to ask\n  - --yes forgets without asking\n"},
        {"@R clear", 2, "",
         "velmora: Clearing must be confirmed, and there is no terminal to ask\n  - --yes clears without asking\n"},
        {"@R -y --ecu 7E8 clear", 2, "",
         "velmora: Clearing reaches all control modules; it can't be held to one\n"
         "  - leave --ecu out to clear the codes of all\n"},
        {"watch --check-config -o csv:@F/a.csv RPM SPEED", 0, "", "The settings make sense\n"},
        {"-p sim:no-such-car scan --report @F/x.pdf", 2, "", "velmora: The ending of @F/x.pdf names no form"},
        {"@R routines --run 01", 2, "",
         "velmora: Running a routine must be confirmed, and there is no terminal to ask\n"
         "  - --yes runs it without asking\n"},
    });
    std::string const listed = run("simulate --list").out;
    for (char const* const part : {"\nAdapters:\n  elm327-v1.5\n", "\nDrives:\n  town\n", "\nFaults:\n  garbage=P\n",
                                   "\nControl lines:\n  ignition on|off: "}) {
        EXPECT_THAT(listed, HasSubstr(part));
    }
}

} // namespace
