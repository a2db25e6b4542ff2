#include "libvelmora/watch/watchsettings.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>

namespace {

using namespace std::chrono_literals;
using testing::AllOf;
using testing::ElementsAre;
using testing::HasSubstr;
using velmora::parseDuration;
using velmora::parseWatchSettings;
using velmora::WatchSettings;

std::string settingsComplaint(std::string const& text)
{
    try {
        parseWatchSettings(text, "w.toml");
    } catch (velmora::Error const& error) {
        EXPECT_EQ(error.kind(), velmora::ErrorKind::WrongUse);
        return error.what();
    }
    return "";
}

TEST(WatchSettings, ReadsAll)
{
    WatchSettings const settings = parseWatchSettings(R"(
port = "/dev/ttyUSB0"
vehicle = "van"
vin = "full"
fast = true
codes_every = "5min"
sensors = ["RPM@10hz", "7E8:SPEED"]
[battery]
stop_after = "90s"
running_volts = 13
wake = "every 30min"
electric = true
[[output]]
to = "csv:drive.csv"
rotate = "day"
queue = 500
[[output]]
to = "mqtts://broker:8883/cars?qos=1"
ca = "/etc/ca.pem"
)",
                                                      "w.toml");
    EXPECT_EQ(settings.port, "/dev/ttyUSB0");
    EXPECT_EQ(settings.vehicle, "van");
    EXPECT_TRUE(settings.fullVin);
    EXPECT_TRUE(settings.fast);
    EXPECT_EQ(settings.codesEvery, 5min);
    EXPECT_THAT(settings.sensors, ElementsAre("RPM@10hz", "7E8:SPEED"));
    EXPECT_EQ(settings.battery.stopAfter, 90s);
    EXPECT_EQ(settings.battery.runningVolts, 13.0);
    EXPECT_EQ(settings.battery.wakeEvery, 30min);
    EXPECT_TRUE(settings.battery.electric);
    ASSERT_EQ(settings.outputs.size(), 2U);
    EXPECT_EQ(settings.outputs[0].option("queue"), "500");
    EXPECT_EQ(settings.outputs[1].option("ca"), "/etc/ca.pem");
    EXPECT_EQ(settings.outputs[1].option("qos"), "1");
}

TEST(WatchSettings, AnAdapterThatSleepsIsAskedNothing)
{
    EXPECT_TRUE(parseWatchSettings("battery.adapter_sleep = true", "w").battery.adapterSleep);
    EXPECT_THAT(settingsComplaint("[battery]\nadapter_sleep = true\nwake = \"every 30min\""),
                HasSubstr("w.toml:1: battery.adapter_sleep: a request would wake the adapter"));
}

TEST(WatchSettings, TellsEveryMistakeWithLineAndKey)
{
    EXPECT_THAT(settingsComplaint(R"(prot = "x"
vehicle = "my van"
vin = "half"
sensors = ["RPM", "RPM@fast"]
codes_every = 5
[battery]
stop_after = "soon"
low_volts = 120
wake = "every 5s"
volts = 1
[[output]]
to = "tape:x"
[[output]]
rotate = "day"
[[output]]
to = "csv:a"
qos = 1
[[output]]
to = "csv:/dev/null"
)"),
                AllOf(HasSubstr("w.toml:1: prot: is not known here"), HasSubstr("w.toml:2: vehicle: must"),
                      HasSubstr("w.toml:3: vin: must"), HasSubstr("w.toml:4: sensors: "),
                      HasSubstr("w.toml:5: codes_every: must"), HasSubstr("w.toml:7: battery.stop_after: must"),
                      HasSubstr("w.toml:8: battery.low_volts: must"), HasSubstr("w.toml:9: battery.wake: must"),
                      HasSubstr("w.toml:10: battery.volts: is not known here"),
                      HasSubstr("w.toml:11: output: \"tape:x\" is no output"),
                      HasSubstr("w.toml:13: output.to: is missing"),
                      HasSubstr("w.toml:15: output: The output csv:a has no setting \"qos\""),
                      HasSubstr("w.toml:18: output: /dev/null is a device, no plain file")));
    EXPECT_THAT(settingsComplaint("port = \"a\"\nvehicle = "), HasSubstr("w.toml:2: "));
    EXPECT_THAT(settingsComplaint("output = 3\nbattery = 4"),
                AllOf(HasSubstr("w.toml:1: output: must"), HasSubstr("w.toml:2: battery: must")));
    EXPECT_EQ(settingsComplaint(""), "");
    EXPECT_THAT(settingsComplaint("signals = \"mine.toml\""), HasSubstr("w.toml:1: signals: must be a list of files"));
    EXPECT_THAT(settingsComplaint("signals = [\n3]"), HasSubstr("w.toml:2: signals: must be the name of a file"));
}

TEST(WatchSettings, NamesSignalFilesFromItsOwnFolder)
{
    testsupport::TemporaryFolder folder;
    std::string const file = folder.file("watch.toml");
    std::ofstream(file) << "signals = [\"mine.toml\", \"/etc/theirs.toml\"]\n";
    EXPECT_THAT(velmora::readWatchSettings(file).signals, ElementsAre(folder.file("mine.toml"), "/etc/theirs.toml"));
    EXPECT_THAT(parseWatchSettings("signals = [\"mine.toml\"]", "w").signals, ElementsAre("mine.toml"));
}

TEST(WatchSettings, AreATextOfAMegabyteAtMost)
{
    testsupport::TemporaryFolder folder;
    std::string const file = folder.file("watch.toml");
    auto const trouble = [&file] {
        try {
            velmora::readWatchSettings(file);
        } catch (velmora::Error const& error) {
            EXPECT_EQ(error.kind(), velmora::ErrorKind::WrongUse);
            return std::string(error.what());
        }
        return std::string();
    };
    EXPECT_EQ(trouble(), "Could not read " + file + ": there is no such file");
    std::ofstream(file) << std::string(1 << 20, '#');
    EXPECT_EQ(trouble(), "");
    std::ofstream(file, std::ios::app) << "#";
    EXPECT_EQ(trouble(), "Could not read " + file + ": it has 1048577 bytes; at most 1048576 are read");
}

TEST(WatchSettings, TimesHaveUnits)
{
    EXPECT_EQ(parseDuration("250ms"), 250ms);
    EXPECT_EQ(parseDuration("90s"), 90s);
    EXPECT_EQ(parseDuration("2min"), 2min);
    EXPECT_EQ(parseDuration("1h"), 1h);
    for (char const* const wrong : {"", "5", "s", "-1s", "0s", "1d", "1 s", "1sx", "9999999999s"}) {
        EXPECT_FALSE(parseDuration(wrong)) << wrong;
    }
}

} // namespace
