// What commands do when all is well: files that they write and read, and what is told beside what is printed.
#include "tests/program/commandrun.h"

#include <nlohmann/json.hpp>

#include <set>
#include <sys/stat.h>

namespace {

using namespace velmora::cli;
using nlohmann::json;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;

TEST_F(CommandRun, AHistoryIsExportedForItsOwnerAlone)
{
    std::string const all = m_folder.file("all");
    EXPECT_EQ(run("@R scan --no-history").code, ExitCode::Done);
    EXPECT_EQ(run("history").out, "Nothing is kept yet; velmora scan --history keeps a scan\n");
    EXPECT_EQ(run("@R scan --history --vehicle van").err, "");
    EXPECT_EQ(run("@R scan --history --vehicle van").code, ExitCode::Done);
    expect({
        {"history export @F/all", 0, "Exported 2 scans to " + all + "\n", ""},
        {"history export @F/all", 1, "",
         "velmora: Could not write @F/all: File exists\n  - name a file that does not stand yet\n"},
        {"history import @F/all", 0, "Imported 0 scans, 2 scans known already\n", ""},
        {"diff", 0, "van\n  scan 1 of ", ""},
        {"diff 2", 2, "", "velmora: Scan 2 is the newest of its vehicle\n  - name an older one, or two\n"},
        {"-y history forget van", 0, "Forgot 2 scans\n", ""},
        {"-y history forget van", 2, "",
         "velmora: Nothing is kept of van\n"
         "  - velmora history lists the vehicles\n"},
        {"history import @F/all", 0, "Imported 2 scans, 0 scans known already\n", ""},
    });
    struct stat info
    {};
    EXPECT_EQ(::stat(all.c_str(), &info), 0);
    EXPECT_EQ(info.st_mode & 0777U, 0600U);
    std::istringstream lines(m_folder.read("all"));
    std::vector<std::string> vehicles;
    for (std::string line; std::getline(lines, line);) {
        vehicles.push_back(json::parse(line)["vehicle"]);
    }
    EXPECT_THAT(vehicles, ElementsAre("van", "van"));
    EXPECT_EQ(run("history export -").out, m_folder.read("all"));
    EXPECT_EQ(json::parse(run("--json history import " + all).out), json({{"added", 0}, {"known", 2}}));
    EXPECT_EQ(json::parse(run("--json diff").out)["worse"], false);
    EXPECT_EQ(json::parse(run("--json history").out).size(), 2U);
    EXPECT_THAT(run("history show 3").out, StartsWith("van\n  3  "));
    EXPECT_EQ(json::parse(run("--json -y history forget van").out), json({{"forgotten", 2}}));
}

TEST_F(CommandRun, AProbeWritesWhatItFinds)
{
    std::string const line = "-q -p sim:petrol-can11-modules?instant signals probe --module 743 --reply 763 "
                             "--from F187 --to F187 -o @F/p.toml";
    expect({
        {line.c_str(), 0, "  F187  32383430302D5331303034  28400-S1004\n", "1 signal in @F/p.toml\n"},
        {line.c_str(), 2, "",
         "velmora: @F/p.toml is there already\n  - --output names another file, --force replaces it\n"},
        {"signals check @F/p.toml", 0, m_folder.file("p.toml") + ": 1 signal\n", ""},
        {"@B signals probe --module 7E1 --from F187 --to F187 -o @F/q.toml", 5, "",
         "velmora: The module 7E1 does not answer\n  - `velmora modules` looks for the modules that do\n"},
    });
    EXPECT_EQ(json::parse(run("--json " + line + " --force").out)["told"].size(), 1U);
    Ended const loud = run("-p sim:" + m_folder.file("bare.toml") +
                           "?instant signals probe --module 7E2 --from F187 --to F187 -o @F/q.toml");
    EXPECT_THAT(loud.err, HasSubstr("\nWhat was found is kept: the same command goes on with it if the car tells its "
                                    "VIN\nvelmora: The module "));
    std::ofstream(m_folder.file("bad.toml")) << "[[signal]]\nid = \"A B\"\n";
    Ended const bad = run("signals check @F/bad.toml");
    EXPECT_EQ(bad.code, ExitCode::WrongUse);
    EXPECT_THAT(bad.err, StartsWith(m_folder.file("bad.toml") + ":2: signal 1, id: must be a text of capitals"));
    EXPECT_THAT(run("signals list @F/bad.toml").err,
                HasSubstr("  - " + m_folder.file("bad.toml") + ":2: signal 1, id: "));
}

TEST_F(CommandRun, SignalsAreListedAndTakenFromOtherFiles)
{
    std::ofstream(m_folder.file("app.csv")) << "Name,ShortName,ModeAndPID,Equation,Min Value,Max Value,Units,Header\n"
                                               "G\u00e4nge,GEAR,220102,A,0,8,,7E1\n"
                                               "Lock,LOCK,2E0102,A,0,8,,7E1\n";
    Ended const taken = run("signals import @F/app.csv");
    EXPECT_EQ(taken.code, ExitCode::Done);
    EXPECT_THAT(taken.out, HasSubstr("[[signal]]\n"));
    EXPECT_THAT(taken.err, HasSubstr(m_folder.file("app.csv") + ":3: "));
    EXPECT_THAT(taken.err, testing::EndsWith("1 signal taken, 1 left out\n"));
    EXPECT_THAT(run("--json signals import @F/app.csv").out, StartsWith("{"));
    std::ofstream(m_folder.file("app.toml")) << taken.out;
    EXPECT_THAT(run("signals list @F/app.toml").out, HasSubstr("app.toml\n  G_NGE  G\u00e4nge  7E1  220102\n"));
    EXPECT_THAT(run("--json signals list @F/app.toml").out, HasSubstr("\"G\u00e4nge\"")) << "as it is written";
    std::ofstream(m_folder.file("nothing.csv"))
        << "Name,ShortName,ModeAndPID,Equation,Min Value,Max Value,Units,Header\n"
           "Lock,LOCK,2E0102,A,0,8,,7E1\n";
    EXPECT_EQ(run("signals import @F/nothing.csv").code, ExitCode::Failed);
}

TEST_F(CommandRun, KeysThatNothingReadsAreNamed)
{
    std::ofstream(m_folder.file("settings.toml")) << "colour = \"red\"\n";
    EXPECT_THAT(run("settings").err, HasSubstr("Nothing reads colour in " + m_folder.file("settings.toml") + "\n"));
    EXPECT_EQ(run("-q settings").err, "");
    std::ofstream(m_folder.file("settings.toml")) << "";
    EXPECT_EQ(run("settings").err, "");
}

TEST_F(CommandRun, ABundleIsWrittenOnceAndWithoutTheVin)
{
    std::string const line = "-q -p sim:petrol-can11?instant doctor --bundle @F/bundle.txt";
    EXPECT_EQ(run(line).code, ExitCode::Done);
    EXPECT_THAT(m_folder.read("bundle.txt"), testing::Not(HasSubstr("VELMRAS1MM0000001")));
    EXPECT_EQ(run(line).code, ExitCode::WrongUse) << "it stands already";
    EXPECT_EQ(run(line + " --force --keep-vin").code, ExitCode::Done);
}

TEST_F(CommandRun, WhatFollowsAnOutputIsASensor)
{
    EXPECT_EQ(run("watch --check-config -o csv:@F/w.csv SPEED").code, ExitCode::Done);
}

TEST_F(CommandRun, SensorsThatStaySilentAreNamed)
{
    std::ofstream(m_folder.file("half.toml"))
        << "name = \"Half\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\nlive = \"0C\"\n"
           "raw = { \"0100\" = \"41 00 00 18 00 00\" }\n";
    std::string const car = "-p sim:" + m_folder.file("half.toml") + "?instant";
    std::string const connecting = "Connecting to sim:" + m_folder.file("half.toml") + "?instant ...\n";
    EXPECT_EQ(run(car + " live --duration 0.2 RPM SPEED").err, connecting + "No value came of: Vehicle Speed Sensor\n");
    EXPECT_EQ(run("-q " + car + " live --duration 0.2 RPM SPEED").err, "");
    Ended const silent = run("-q " + car + " live --duration 0.2 SPEED");
    EXPECT_EQ(static_cast<int>(silent.code), 5);
    EXPECT_EQ(silent.err, "velmora: The vehicle gave none of the chosen values\n  - is the ignition on?\n"
                          "  - `velmora sensors` lists what the vehicle offers\n");
    std::ofstream(m_folder.file("own.toml")) << "[[signal]]\nid = \"WRONG\"\nname = \"Wrong\"\nheader = \"7E0\"\n"
                                                "request = \"22F190\"\nformula = \"A\"\n";
    std::string const own = " --signals @F/own.toml live --duration 0.2 RPM WRONG";
    EXPECT_EQ(run("-p sim:@F/refusing.toml?instant" + own).err,
              "Connecting to sim:" + m_folder.file("refusing.toml") +
                  "?instant ...\nWRONG is refused: Service Not Supported\nNo value came of: Wrong\n");
    EXPECT_EQ(run("@R" + own).err, "");
    EXPECT_TRUE(std::regex_search(run("-v @B live -n 2 RPM").err, std::regex("\n2 readings, \\d+\\.\\d a second\n")));
}

TEST_F(CommandRun, TheTrafficIsShownAndWritten)
{
    std::string const plain = run("@B log -n 4 RPM").out;
    EXPECT_TRUE(std::regex_search(plain, std::regex("^\\d\\d:\\d\\d:\\d\\d >> ATI\n\\S+ << ATIELM327 v1.5\n")));
    EXPECT_THAT(plain, HasSubstr(" >> 010C"));
    EXPECT_THAT(plain, testing::Not(HasSubstr(" >> ATZ"))) << "nobody has asked for a reset";
    EXPECT_THAT(plain, HasSubstr(" >> ATTP0"));
    EXPECT_THAT(run("@B -P 6 log -n 1 RPM").out, HasSubstr(" >> ATTP6"));
    EXPECT_EQ(run("@B --log @F/log --trace @F/trace info").code, ExitCode::Done);
    EXPECT_TRUE(std::regex_search(m_folder.read("trace"), std::regex("^\\d\\d:\\d\\d:\\d\\d\\.\\d{3} >> ATI\\\\r\n")));
    EXPECT_GT(m_folder.read("log").size(), 500U);
}

TEST_F(CommandRun, TheTrafficEndsWithWhatWasAskedFor)
{
    std::string const told = run("@B --sleep log --duration 0.1").out;
    EXPECT_THAT(told, HasSubstr(" >> ATI\n"));
    std::string const asked = run("@B log --duration 0.2 RPM").out;
    EXPECT_NE(asked.find(" >> 010C"), asked.rfind(" >> 010C")) << "as often as there is time";
    EXPECT_THAT(told, testing::Not(HasSubstr(" >> ATLP"))) << "how the connection is ended is nobody's question";
    std::string const lines = run("@B --json log -n 1 RPM").out;
    EXPECT_EQ(json::parse(lines.substr(0, lines.find('\n')))["direction"], "sent");
}

TEST_F(CommandRun, WhatGotWorseIsToldAndAnExitCodeIfItIsAsked)
{
    for (char const* const codes : {"[]", "[\"P0133\"]"}) {
        std::ofstream(m_folder.file("coded.toml"))
            << "name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\nlive = \"0C\"\nstored = " << codes << "\n";
        EXPECT_EQ(run("-q -p sim:@F/coded.toml?instant scan --history --vehicle van").err, "");
    }
    EXPECT_EQ(run("diff").code, ExitCode::Done);
    EXPECT_EQ(run("diff --check").code, ExitCode::Findings);
    EXPECT_EQ(json::parse(run("--json diff").out)["worse"], true);
    EXPECT_EQ(run("@R scan").err, "") << "without a terminal nothing is asked";
    EXPECT_EQ(json::parse(run("--json history").out).size(), 2U) << "and nothing kept";
}

TEST_F(CommandRun, AReportTellsWhatWasSaidOfTheVehicle)
{
    Ended const scan = run("@R scan --no-history --vehicle van --report @F/a.html");
    EXPECT_EQ(scan.code, ExitCode::Done);
    EXPECT_THAT(m_folder.read("a.html"), HasSubstr("van"));
    EXPECT_EQ(run("@R scan --no-history --report @F/a.html").code, ExitCode::WrongUse) << "it stands already";
    EXPECT_EQ(run("@R scan --no-history --force --report @F/a.html").code, ExitCode::Done);
    EXPECT_NE(run("@R scan --no-history --inspection us-epa --model-year 1999").out,
              run("@R scan --no-history --inspection us-epa --model-year 2005").out);
}

TEST_F(CommandRun, ARecordingThatHasOtherColumnsStays)
{
    std::ofstream(m_folder.file("a.csv")) << "time,Other\n";
    Ended const refused = run("@B live -n 1 SPEED --csv @F/a.csv");
    EXPECT_EQ(refused.code, ExitCode::WrongUse);
    EXPECT_THAT(refused.err, HasSubstr("exists already, and has other columns\n  - --force replaces it\n"));
    EXPECT_EQ(m_folder.read("a.csv"), "time,Other\n");
    EXPECT_EQ(run("@B live -n 1 SPEED --force --csv @F/a.csv").code, ExitCode::Done);
    EXPECT_THAT(m_folder.read("a.csv"), StartsWith("time,Vehicle Speed Sensor (km/h)\n"));
}

TEST_F(CommandRun, ADialogueThatBreaksOffIsRecordedUpToThere)
{
    Ended const lost = run("-p sim:@F/bare.toml?instant&fault=loss@300 record @F/lost.dialogue");
    EXPECT_EQ(static_cast<int>(lost.code), 8) << lost.err;
    EXPECT_THAT(lost.err, HasSubstr(" requests and commands to " + m_folder.file("lost.dialogue") + "\nvelmora: "));
    EXPECT_THAT(m_folder.read("lost.dialogue"), HasSubstr("\n-> ATI\n"));
}

TEST_F(CommandRun, RoundsOfWhatIsSilentCountAsWell)
{
    std::ofstream(m_folder.file("half.toml"))
        << "name = \"Half\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\nlive = \"0C\"\n"
           "raw = { \"0100\" = \"41 00 00 18 00 00\" }\n";
    std::string const out = run("-q -p sim:@F/half.toml?instant live -n 3 RPM SPEED").out;
    EXPECT_EQ(std::count(out.begin(), out.end(), '\n'), 3) << out;
}

TEST_F(CommandRun, TheConsoleHasNoPromptInAPipe)
{
    std::ofstream(m_folder.file("lines")) << "ATI\nquit\nATRV\n";
    int const lines = ::open(m_folder.file("lines").c_str(), O_RDONLY | O_CLOEXEC);
    testing::internal::CaptureStdout();
    testing::internal::CaptureStderr();
    {
        Replaced const input(STDIN_FILENO, lines);
        EXPECT_EQ(runMainAsItIs(meant("-p sim:@F/bare.toml?instant console")), ExitCode::Done);
    }
    ::close(lines);
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "ELM327 v1.5\n");
    EXPECT_THAT(testing::internal::GetCapturedStderr(), testing::Not(HasSubstr("> ")));
}

TEST_F(CommandRun, ASetThatIsRefusedIsNotKnownInFull)
{
    std::ofstream(m_folder.file("half.toml")) << "name = \"Half\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\nlive = \"0C "
                                                 "2F\"\nrefusals = { \"0120\" = \"12\" }\n";
    EXPECT_THAT(run("-q -p sim:@F/half.toml?instant sensors").out,
                HasSubstr("\n  01 current data          0C F4 F5 F6 (not known in full: refused)\n"));
}

TEST_F(CommandRun, OneReadingIsMoreThanNone)
{
    Ended const one = run("@B live --duration 0.2 SPEED --rate 0.1");
    EXPECT_EQ(one.code, ExitCode::Done);
    EXPECT_EQ(one.out, "Vehicle Speed Sensor: 0 km/h\n");
}

TEST_F(CommandRun, ADialogueIsRecorded)
{
    Ended const loud = run("-p sim:@F/bare.toml?instant record @F/a.dialogue");
    EXPECT_TRUE(std::regex_search(
        loud.err, std::regex("\nRecorded [1-9]\\d+ requests and commands to " + m_folder.file("a.dialogue") + "\n$")))
        << loud.err;
    EXPECT_THAT(loud.out, StartsWith("Adapter\n  Device         ELM327 v1.5\n"));
    EXPECT_EQ(run("@B record @F/b.dialogue").err, "");
    EXPECT_GT(m_folder.read("b.dialogue").size(), 500U);
    Ended const none = run("-p sim:no-such-car record @F/c.dialogue");
    EXPECT_EQ(static_cast<int>(none.code), 3);
    EXPECT_THAT(none.err, testing::Not(HasSubstr("Recorded"))) << "there was nothing";
}

TEST_F(CommandRun, OfSeveralModulesTheChosenOnesAreRead)
{
    auto const modules = [this](std::string const& choice) {
        std::set<std::string> all;
        std::istringstream lines(run("-q -p sim:petrol-can11?instant " + choice + " --json live -n 2 05").out);
        for (std::string line; std::getline(lines, line);) {
            all.insert(json::parse(line)["module"]);
        }
        return all;
    };
    EXPECT_THAT(modules(""), ElementsAre("7E8"));
    EXPECT_THAT(modules("--ecu 7E9"), ElementsAre("7E9"));
    EXPECT_THAT(modules("--ecu all"), ElementsAre("7E8", "7E9"));
}

TEST_F(CommandRun, WhatIsOfferedIsListed)
{
    EXPECT_TRUE(
        std::regex_search(run("@B sensors --all").out, std::regex("\n  0C  Engine RPM +rpm +0 to 16384 +offered\n")));
    EXPECT_TRUE(std::regex_search(run("@B sensors --all").out, std::regex("\n  05  Engine Coolant.* -40 to 215 +-\n")));
    json const offers = json::parse(run("@B --json sensors").out);
    EXPECT_EQ(offers[0]["supported"]["01"], json({"0C", "0D", "F4", "F5", "F6"}));
    EXPECT_EQ(offers[0]["supported"]["09"], json::array());
    EXPECT_THAT(run("@R codes --confirmed").out,
                testing::EndsWith("  Confirmed      1 code\n    P0133  Generic        O2 Sensor Circuit Slow Response "
                                  "Bank 1 Sensor 1\n"));
    EXPECT_THAT(run("@R codes").out, HasSubstr("  Pending        refused: service not supported (11)\n  Permanent "));
    EXPECT_EQ(json::parse(run("--json vin 1M8GDM9AXKP042788").out)["wmi"], "1M8");
    json const rows = json::parse(run("--json dtc --make Ford --search lean indicates").out);
    EXPECT_EQ(rows[0].size(), 3U);
    EXPECT_THAT(rows[0]["text"], HasSubstr("Lean"));
}

TEST_F(CommandRun, SettingsAreKept)
{
    EXPECT_THAT(run("settings").out, HasSubstr("\n  displacement  2.00 l    0.05 to 30.00\n"));
    EXPECT_THAT(run("settings displacement 1.6").out, HasSubstr("\n  Value          1.60 l\n"));
    EXPECT_THAT(run("settings limit.RPM 6000").out, HasSubstr("\n  Value          ..6000\n"));
    EXPECT_THAT(run("settings limit.RPM").out, HasSubstr("\n  Value          ..6000\n")) << "asking changes nothing";
    std::string const listed = run("settings").out;
    EXPECT_THAT(listed, HasSubstr("\n  displacement  1.60 l    0.05 to 30.00\n"));
    EXPECT_THAT(listed, HasSubstr("\n  limit.RPM     ..6000\n"));
    json const document = json::parse(run("--json settings").out);
    EXPECT_EQ(document.back()["name"], "limit.RPM");
    EXPECT_EQ(document.back()["key"], "limit/RPM");
    EXPECT_EQ(json::parse(run("--json settings limit.RPM none").out)["value"], nullptr);
}

TEST_F(CommandRun, TheProgramDescribesItself)
{
    EXPECT_EQ(run("__complete sc").out, "scan\tReport on the adapter and all control modules\n");
    EXPECT_THAT(run("__complete live RP").out, StartsWith("RPM\tPID 0C\n"));
    EXPECT_THAT(run("__complete live 7E9:RP").out, StartsWith("7E9:RPM\tPID 0C\n"));
    EXPECT_THAT(run("__complete live 7E9:al").out, HasSubstr("\n7E9:all\t"));
    Ended const all = run("__complete");
    EXPECT_EQ(all.code, ExitCode::Done);
    EXPECT_EQ(all.err, "");
    std::istringstream codes(run("__complete dtc p042").out);
    std::set<std::string> different;
    int lines = 0;
    for (std::string line; std::getline(codes, line); ++lines) {
        EXPECT_THAT(line, StartsWith("P042"));
        different.insert(line.substr(0, line.find('\t')));
    }
    EXPECT_GE(lines, 16);
    EXPECT_EQ(different.size(), static_cast<std::size_t>(lines)) << "each code once";
    EXPECT_EQ(run("__complete dtc P0").out, "") << "too many";
    EXPECT_THAT(run("__complete dtc P04").out, StartsWith("P04"));
    EXPECT_NE(run("__complete trips x").out, run("__complete vin x").out) << "files, and nothing";
    std::filesystem::create_directory(m_folder.path() / "pages");
    EXPECT_EQ(run("__manual @F/pages").code, ExitCode::Done);
    EXPECT_THAT(m_folder.read("pages/velmora-scan.1"), HasSubstr(".TH"));
}

TEST_F(CommandRun, ADialogueWithoutTimesIsAVehicle)
{
    std::ofstream(m_folder.file("flat.dialogue"))
        << "vehicle: made up\nadapter: ELM327 v1.5\nprotocol: 6\nheaders: on\n\n"
           "-> 0100\n<- 7E8 06 41 00 00 18 00 00 \\r\\r>\n-> 010C\n<- 7E8 04 41 0C 1A F8 \\r\\r>\n";
    Ended const played = run("live --play @F/flat.dialogue -n 1 RPM");
    EXPECT_EQ(played.out, "Engine RPM: 1726 rpm\n");
    EXPECT_THAT(played.err, StartsWith("The dialogue has no times: it is read as a vehicle, without pause and bar\n"));
}

// What no command expects, such as memory that has run out.
TEST_F(CommandRun, AnyOtherFailureIsToldAndAnExitCode)
{
    auto const failing = [](auto const& failure) {
        SignalsAsBefore const signals;
        Interrupt const interrupt;
        CommandLine commandLine;
        commandLine.addCommand("fail", "", [&](GlobalOptions const&) -> ExitCode { throw failure; });
        char const* const arguments[] = {"velmora", "fail"};
        testing::internal::CaptureStderr();
        ExitCode const code = commandLine.run(2, arguments);
        return std::to_string(static_cast<int>(code)) + " " + testing::internal::GetCapturedStderr();
    };
    EXPECT_EQ(failing(std::runtime_error("no memory")), "1 velmora: no memory\n");
    EXPECT_EQ(failing(std::system_error(ENOSPC, std::generic_category(), "pipe")),
              "1 velmora: pipe: No space left on device\n");
    EXPECT_EQ(failing(velmora::Error(velmora::ErrorKind::LinkLost, "gone", {"one", "two"})),
              "8 velmora: gone\n  - one\n  - two\n");
}

} // namespace
