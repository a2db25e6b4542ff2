// A recording as lines, and what of it is chosen.
#include "libvelmora/replay/recordingfile.h"
#include "program/live/playrun.h"
#include "program/terminal/interrupt.h"
#include "tests/program/terminal/terminalinput.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <sstream>

namespace {

using namespace velmora;
using namespace velmora::cli;

class PlayedLines : public testing::Test
{
protected:
    std::string played(std::vector<std::string> const& words, bool json = false)
    {
        std::istringstream in("time,7E8 RPM (rpm),7E8 MAP (kPa),7E8 STATE\n"
                              "2024-03-07T09:05:00.000Z,800,30.5,on\n"
                              "2024-03-07T09:05:01.000Z,1000,30,-\n");
        GlobalOptions options;
        options.json = json;
        options.settingsFile = testsupport::ownPath("playrun.toml");
        PlayRun run(options, "drive.csv", readCsv(in), words, 1.0);
        testing::internal::CaptureStdout();
        run.run();
        return testing::internal::GetCapturedStdout();
    }

private:
    SignalsAsBefore const m_signals;
    Interrupt const m_interrupt;
};

TEST_F(PlayedLines, TellEachValueInItsTurn)
{
    EXPECT_EQ(played({}), "7E8 RPM: 800 rpm\n7E8 MAP: 30.5 kPa\n7E8 STATE: on\n"
                          "7E8 RPM: 1000 rpm\n7E8 MAP: 30.0 kPa\n7E8 STATE: -\n");
}

TEST_F(PlayedLines, AreOfTheSensorsThatAreNamed)
{
    EXPECT_EQ(played({"stat", "rp"}), "7E8 RPM: 800 rpm\n7E8 STATE: on\n7E8 RPM: 1000 rpm\n7E8 STATE: -\n");
    EXPECT_EQ(played({"RPM", "rp", "rpm"}), played({"RPM"})) << "none twice";
    EXPECT_EQ(played({"a"}), "7E8 MAP: 30.5 kPa\n7E8 STATE: on\n7E8 MAP: 30.0 kPa\n7E8 STATE: -\n");
    try {
        played({"rpm", "speed"});
        FAIL() << "there is no such sensor";
    } catch (Error const& error) {
        EXPECT_EQ(error.kind(), ErrorKind::NotSupported);
        EXPECT_STREQ(error.what(), "The recording has no sensor \"speed\"");
        EXPECT_EQ(error.hints(), std::vector<std::string>{"without any, all of it is played"});
    }
}

TEST_F(PlayedLines, OfJsonHaveTheRecordingsTime)
{
    EXPECT_EQ(played({"RPM"}, true),
              "{\"time\":\"2024-03-07T09:05:00.000Z\",\"module\":\"7E8\",\"pid\":null,\"uid\":0,\"name\":\"7E8 RPM\","
              "\"value\":800,\"unit\":\"rpm\",\"minimum\":800,\"mean\":800,\"maximum\":800,\"sensor\":\"RPM\"}\n"
              "{\"time\":\"2024-03-07T09:05:01.000Z\",\"module\":\"7E8\",\"pid\":null,\"uid\":0,\"name\":\"7E8 RPM\","
              "\"value\":1000,\"unit\":\"rpm\",\"minimum\":800,\"mean\":900,\"maximum\":1000,\"sensor\":\"RPM\"}\n");
}

TEST_F(PlayedLines, OfARecordingThatIsCutOrHasNoDateSaySo)
{
    std::istringstream in("time,7E8 RPM (rpm)\n2024-03-07T09:05:00.000Z,800\n");
    Recording recording = readCsv(in);
    recording.cut = true;
    recording.dated = false;
    GlobalOptions options;
    options.json = true;
    PlayRun run(options, "drive.csv", recording, {}, 1.0);
    testing::internal::CaptureStdout();
    testing::internal::CaptureStderr();
    run.run();
    EXPECT_EQ(testing::internal::GetCapturedStderr(),
              "The recording holds more than can be played; its end is left out\n");
    EXPECT_EQ(testing::internal::GetCapturedStdout().substr(0, 27), "{\"time\":null,\"module\":\"7E8\"");
}

} // namespace
