// What the command line offers and takes, without a vehicle.
#include "tests/program/runline.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <regex>
#include <set>
#include <sstream>

namespace {

using namespace velmora::cli;
using testing::ElementsAreArray;
using testing::HasSubstr;
using testing::StartsWith;

// What the help of a command lists below a title, by the first word of each entry.
std::vector<std::string> listed(std::string const& help, std::string const& title)
{
    std::vector<std::string> found;
    std::size_t const begin = help.find("\n" + title + ":\n");
    std::istringstream lines(begin == std::string::npos ? "" : help.substr(begin + title.size() + 3));
    for (std::string line; std::getline(lines, line) && !line.empty();) {
        if (line[2] != ' ') {
            found.push_back(line.substr(2, line.find_first_of(" ", 2) - 2));
        }
    }
    return found;
}

struct Offered
{
    char const* command;
    char const* options; // beside the help's own, in the order of the help
    char const* places = "";
    char const* subcommands = "";
};

constexpr char const* watchOptions =
    "-o,--output --config --check-config --vehicle --vin --stop-after --wake --electric --fast";

Offered const offers[] = {
    {"",
     "-p,--port -b,--baud -P,--protocol -u,--units --ecu --json --log --trace --signals --settings --reset -y,--yes "
     "--sleep --forget -q,--quiet -v,--verbose --color",
     "",
     "scan live sensors codes clear freeze readiness monitors oxygen counters info routines doctor history diff dtc "
     "vin "
     "console log record watch dash trips settings signals modules simulate ports"},
    {"scan", "--check --make --report --mask-vin --force --inspection --model-year --vehicle --history --no-history"},
    {"live", "--csv --rate --fast --pids --play --speed --force -n,--count --duration", "SENSOR"},
    {"sensors", "--all"},
    {"codes", "--confirmed --pending --permanent --uds --make"},
    {"clear", ""},
    {"freeze", "--make", "FRAME"},
    {"info", "--uds"},
    {"routines", "--run"},
    {"history", "", "", "show forget export import"},
    {"history show", "", "N"},
    {"history forget", "", "VIN"},
    {"history export", "", "FILE"},
    {"history import", "", "FILE"},
    {"diff", "--vehicle --check", "OLD NEW"},
    {"dtc", "--search --make --dump", "CODE"},
    {"vin", "", "VIN"},
    {"log", "-n,--count --duration", "SENSOR"},
    {"record", "--vehicle --keep-vin", "FILE"},
    {"watch", watchOptions, "SENSOR"},
    {"trips", "--csv", "DB"},
    {"settings", "", "SETTING VALUE"},
    {"signals", "", "", "import check list probe"},
    {"signals import", "", "FILE"},
    {"signals check", "", "FILE"},
    {"signals list", "", "FILE"},
    {"signals probe", "--module --reply --ext --service --from --to -o,--output --fresh --force"},
    {"modules", "--scan --all"},
    {"simulate", "--listen --vehicle --replay --adapter --fault --scenario --drive --write-scenario --control --fleet "
                 "--list"},
    {"ports", "--known", "", "pair"},
    {"ports pair", "", "MAC"},
};

TEST(CommandLine, EachCommandOffersItsOptions)
{
    for (Offered const& each : offers) {
        std::vector<std::string> words = wordsOf(each.command);
        words.emplace_back("--help");
        Ended const help = runLine(words);
        EXPECT_EQ(help.code, ExitCode::Done) << each.command;
        EXPECT_EQ(help.err, "") << each.command;
        std::vector<std::string> options = listed(help.out, "Options");
        for (char const* own : {"-V,--version", "--licenses", "-h,--help", "--help-all"}) {
            bool const everywhere = std::string(own).find("help") != std::string::npos;
            auto const place = std::find(options.begin(), options.end(), own);
            EXPECT_EQ(place != options.end(), everywhere || *each.command == '\0') << each.command << " " << own;
            options.erase(place == options.end() ? place : options.begin(), place == options.end() ? place : place + 1);
        }
        EXPECT_THAT(options, ElementsAreArray(wordsOf(each.options))) << each.command;
        EXPECT_THAT(listed(help.out, "Positionals"), ElementsAreArray(wordsOf(each.places))) << each.command;
        EXPECT_THAT(listed(help.out, "Subcommands"), ElementsAreArray(wordsOf(each.subcommands))) << each.command;
        EXPECT_THAT(help.out, HasSubstr("\nExit codes: 0 done; 1 failed otherwise; 2 wrong use; ")) << each.command;
    }
}

TEST(CommandLine, AnOptionSaysWhatItTakes)
{
    std::string const all = runLine({"--help-all"}).out + runLine({"signals", "probe", "--help"}).out +
                            runLine({"history", "show", "--help"}).out;
    for (char const* line : {"  -p,--port PORT (Env:VELMORA_PORT)\n",
                             "  -b,--baud N ",
                             "  -P,--protocol N ",
                             "  -u,--units SYSTEM ",
                             "  --ecu ID ",
                             "  --log FILE ",
                             "  --trace FILE ",
                             "  --signals FILE  ",
                             "  --settings FILE (Env:VELMORA_SETTINGS)\n",
                             "  --color WHEN ",
                             "  --make MAKER ",
                             "  --inspection RULE ",
                             "  --model-year YEAR ",
                             "  --csv FILE ",
                             "  --rate HZ ",
                             "  --pids N ",
                             "  --play FILE ",
                             "  --speed X ",
                             "  -n,--count N ",
                             "  --duration S ",
                             "  --stop-after TIME ",
                             "  --wake WAY ",
                             "  --vin none|full ",
                             "  -o,--output KIND:TARGET ... ",
                             "  --run ID ",
                             "  --module ID ",
                             "  --reply ID ",
                             "  --ext HEX ",
                             "  --service HEX ",
                             "  --from HEX ",
                             "  --to HEX ",
                             "  --listen ADDRESS (tcp://127.0.0.1:35000)\n",
                             "  --fleet N ",
                             "  --control N ",
                             "  --vehicle VEHICLE ",
                             "  --adapter ADAPTER ",
                             "  --drive DRIVE ",
                             "  FRAME N ",
                             "  VIN  ",
                             "  SENSOR ... ",
                             "  --vehicle WORDS ",
                             "  N   "}) {
        EXPECT_NE(all.find(line), std::string::npos) << line;
    }
}

TEST(CommandLine, WhatCannotBeMeantIsWrongUse)
{
    struct Wrong
    {
        char const* line;
        char const* told;
    };
    for (Wrong const& each :
         {Wrong{"", "velmora: A subcommand is required\n"},
          {"fly", "velmora: \"fly\" is no command or option\n"},
          {"--fly info", "velmora: \"--fly\" is no command or option\n"},
          {"-b 299 info", "velmora: --baud: Value 299 not in range 300 to 4000000\n"},
          {"-b 4000001 info", "velmora: --baud: Value 4000001 not in range"},
          {"-P 10 info", "velmora: \"10\" is not understood; expected auto or a number from 1 to 9\n"},
          {"-u miles info", "velmora: \"miles\" is not understood; expected metric, imperial or imperial-uk\n"},
          {"--color red info", "velmora: \"red\" is not understood; expected auto, always or never\n"},
          {"--ecu ALL info",
           "velmora: \"ALL\" is not understood; expected a control module id in hexadecimal, such as"},
          {"scan --inspection mars",
           "velmora: \"mars\" is no rule; known are us-epa, us-california, uk-mot, de-au and"},
          {"scan --history --no-history", "velmora: "},
          {"live --play a --csv b", "velmora: "},
          {"live --speed 2", "velmora: --speed requires --play\n"},
          {"live --fast --pids 0", "velmora: --pids: Value 0 not in range 1 to 6\n"},
          {"freeze 256", "velmora: FRAME: Value 256 not in range 0 to 255\n"},
          {"scan --model-year 1979", "velmora: --model-year: Value 1979 not in range 1980 to 2100\n"},
          {"history show", "velmora: N is required\n"},
          {"history forget", "velmora: VIN is required\n"},
          {"history export", "velmora: FILE is required\n"},
          {"history import", "velmora: FILE is required\n"},
          {"ports pair", "velmora: MAC is required\n"},
          {"record", "velmora: FILE is required\n"},
          {"trips", "velmora: DB is required\n"},
          {"vin", "velmora: VIN is required\n"},
          {"signals", "velmora: A subcommand is required\n"},
          {"signals check", "velmora: FILE is required\n"},
          {"signals list", "velmora: FILE is required\n"},
          {"signals import", "velmora: FILE is required\n"},
          {"simulate --control 65536", "velmora: --control: Value 65536 not in range 0 to 65535\n"}}) {
        Ended const ended = runLine(wordsOf(each.line));
        EXPECT_EQ(ended.code, ExitCode::WrongUse) << each.line;
        EXPECT_EQ(ended.out, "") << each.line;
        EXPECT_THAT(ended.err, StartsWith(each.told)) << each.line;
        EXPECT_THAT(ended.err, testing::EndsWith("\n  - velmora --help lists the options and commands\n")) << each.line;
    }
}

TEST(CommandLine, TellsItsVersionAndItsLicences)
{
    Ended const version = runLine({"--version"});
    EXPECT_EQ(version.code, ExitCode::Done);
    EXPECT_TRUE(
        std::regex_match(version.out, std::regex("velmora \\d+\\.\\d+\\.\\d+\\S*\nlibobd \\d+\\.\\d+\\.\\d+\\S*, "
                                                 "C ABI \\d+\noutputs: csv.*\nparts: .+\n")))
        << version.out;
    Ended const licences = runLine({"--licenses"});
    EXPECT_EQ(licences.code, ExitCode::Done);
    EXPECT_THAT(licences.out, HasSubstr("Permission is hereby granted, free of charge"));
}

} // namespace
