// Live values as a user meets them: in files, in pipes, and when the link goes.

#include "tests/e2e/childprocess.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <fstream>

namespace {

using e2e::ChildProcess;
using e2e::Outcome;
using e2e::runVelmora;

std::string contentOf(std::string const& file)
{
    std::ifstream in(file);
    return {std::istreambuf_iterator<char>(in), {}};
}

TEST(Live, LinkThatBreaksIsExitCodeEightAndKeepsTheRecording)
{
    ChildProcess simulator(
        {"simulate", "--listen", "tcp://127.0.0.1:0", "--vehicle", "petrol-can11", "--fault", "loss@2500"});
    std::string const file = testsupport::ownPath("live-e2e.csv");
    Outcome const outcome = runVelmora({"-v", "-p", simulator.readLine(), "live", "RPM", "SPEED", "13", "--csv", file});
    EXPECT_EQ(outcome.exitCode, 8) << outcome.err;
    EXPECT_NE(outcome.err.find("The link to the adapter broke"), std::string::npos) << outcome.err;
    EXPECT_NE(outcome.err.find(" readings, "), std::string::npos) << outcome.err;
    std::string const recording = contentOf(file);
    EXPECT_TRUE(recording.starts_with("time,Engine RPM (rpm),Vehicle Speed Sensor (km/h),Location of Oxygen Sensors\n"))
        << recording;
    EXPECT_GE(std::count(recording.begin(), recording.end(), '\n'), 3) << recording;
    EXPECT_TRUE(recording.ends_with(",\"B1S1, B1S2\"\n")) << "the last row is whole: " << recording;
    std::remove(file.c_str());
}

TEST(Live, WhoAsksWithoutThePauseIsToldSoOnce)
{
    std::vector<std::string> const live{"-p", "sim:petrol-can11?instant", "live", "RPM", "--count", "20"};
    auto const toldTimes = [&live](std::vector<std::string> const& options) {
        std::vector<std::string> arguments = live;
        arguments.insert(arguments.end(), options.begin(), options.end());
        Outcome const outcome = runVelmora(arguments);
        EXPECT_EQ(outcome.exitCode, 0) << outcome.err;
        std::string const words = "Asking without the pause that spares the vehicle";
        std::size_t const first = outcome.err.find(words);
        return first == std::string::npos ? 0 : outcome.err.find(words, first + 1) == std::string::npos ? 1 : 2;
    };
    EXPECT_EQ(toldTimes({"--fast"}), 1);
    EXPECT_EQ(toldTimes({}), 0) << "the pause is kept by default";
}

// The pause between requests leaves some 33 a second, of which the two get an equal share.
TEST(Live, RatesAreToldAndWhatTheBusCanNotGiveIsShared)
{
    Outcome const outcome = runVelmora(
        {"-v", "-p", "sim:petrol-can11", "live", "7E8:RPM@40hz", "7E8:SPEED@40hz", "7E9:05@1hz", "--count", "200"});
    EXPECT_EQ(outcome.exitCode, 0) << outcome.err;
    EXPECT_NE(outcome.err.find("More is asked for than the bus can give: 7E8 RPM "), std::string::npos) << outcome.err;
    std::size_t const told = outcome.err.find("Reached: 7E8 RPM ");
    ASSERT_NE(told, std::string::npos) << outcome.err;
    double engine = 0.0;
    double speed = 0.0;
    EXPECT_EQ(std::sscanf(outcome.err.c_str() + told, "Reached: 7E8 RPM %lf of 40 Hz, 7E8 SPEED %lf of 40 Hz", &engine,
                          &speed),
              2)
        << outcome.err;
    EXPECT_NEAR(engine / speed, 1.0, 0.2);
    EXPECT_NE(outcome.err.find(" of 1 Hz", told), std::string::npos) << outcome.err;

    Outcome const screen =
        e2e::runOnTerminal({"-p", "sim:petrol-can11", "live", "7E8:RPM@40hz", "7E9:05"}, "", " of 40 Hz", "q");
    EXPECT_EQ(screen.exitCode, 0);
    EXPECT_NE(screen.out.find(" of 40 Hz"), std::string::npos) << "in the title, on 80 columns: " << screen.out;

    Outcome const all = runVelmora({"-p", "sim:petrol-can11?instant", "--ecu", "all", "live", "05", "--count", "4"});
    EXPECT_NE(all.out.find("7E8 Engine Coolant"), std::string::npos) << all.out;
    EXPECT_NE(all.out.find("7E9 Engine Coolant"), std::string::npos) << all.out;
}

int linesOf(std::string const& text, std::string const& name)
{
    int lines = 0;
    for (std::size_t at = text.find(name); at != std::string::npos; at = text.find(name, at + 1)) {
        ++lines;
    }
    return lines;
}

// By what it tells, and by what it has written in six seconds.
bool readsAtItsRates(Outcome const& outcome)
{
    double rpm = 0.0;
    double speed = 0.0;
    double coolant = 0.0;
    std::size_t const told = outcome.err.find("Reached: RPM ");
    bool const all =
        told != std::string::npos &&
        std::sscanf(outcome.err.c_str() + told, "Reached: RPM %lf of 5 Hz, SPEED %lf of 2 Hz, COOLANT_TEMP %lf of 2 Hz",
                    &rpm, &speed, &coolant) == 3;
    auto const isNear = [](double value, double wanted) { return std::abs(value - wanted) < 0.2 * wanted; };
    return all && isNear(rpm, 5.0) && isNear(speed, 2.0) && isNear(coolant, 2.0) &&
           isNear(linesOf(outcome.out, "Engine RPM: "), 31.0) &&
           isNear(linesOf(outcome.out, "Vehicle Speed Sensor: "), 13.0) &&
           outcome.err.find("More is asked for") == std::string::npos;
}

// A busy machine may be late, so there is more than one try.
TEST(Live, SensorsAreReadAsOftenAsTheyAreToBe)
{
    Outcome outcome{};
    for (int tries = 0; tries < 4 && !readsAtItsRates(outcome); ++tries) {
        outcome = runVelmora({"-v", "-p", "sim:petrol-can11?instant", "live", "RPM@5hz", "SPEED", "05", "--rate", "2",
                              "--duration", "6"});
        ASSERT_EQ(outcome.exitCode, 0) << outcome.err;
    }
    EXPECT_TRUE(readsAtItsRates(outcome)) << outcome.err << outcome.out;
}

// What `velmora ... | head -1` needs: a reader that has gone ends it without a complaint.
TEST(Live, EndsQuietlyWhenItsReaderHasGone)
{
    std::string const command = std::string("exec 3>&1; { '") + VELMORA_PROGRAM +
                                "' -q -p sim:petrol-can11 live RPM 2>&3; echo exit code $? >&3; } | head -n 1 >&2";
    FILE* const shell = ::popen(command.c_str(), "r");
    ASSERT_NE(shell, nullptr);
    std::string told;
    for (int byte = std::fgetc(shell); byte != EOF; byte = std::fgetc(shell)) {
        told += static_cast<char>(byte);
    }
    ::pclose(shell);
    EXPECT_EQ(told, "exit code 0\n");
}

// What live and watch have written, live reads again.
TEST(Live, PlaysItsOwnRecordings)
{
    std::string const csv = testsupport::ownPath("live-play.csv");
    Outcome const recorded =
        runVelmora({"-q", "-p", "sim:petrol-can11?instant", "live", "RPM", "13", "--csv", csv, "-n", "3"});
    ASSERT_EQ(recorded.exitCode, 0) << recorded.err;
    Outcome const played = runVelmora({"live", "--play", csv});
    EXPECT_EQ(played.exitCode, 0) << played.err;
    EXPECT_EQ(played.out.substr(0, 12), "Engine RPM: ") << played.out;
    EXPECT_NE(played.out.find("Location of Oxygen Sensors: B1S1, B1S2\n"), std::string::npos) << played.out;
    Outcome const chosen = runVelmora({"--json", "live", "--play", csv, "rpm"});
    EXPECT_EQ(chosen.out.find("Oxygen"), std::string::npos) << chosen.out;
    EXPECT_GE(std::count(chosen.out.begin(), chosen.out.end(), '\n'), 3);
    EXPECT_EQ(runVelmora({"live", "--play", csv, "nothing"}).exitCode, 6);
    EXPECT_EQ(runVelmora({"live", "--play", "/nowhere/at/all"}).exitCode, 1);
    std::remove(csv.c_str());
}

} // namespace
