// What the watch tells people: each message of its settings, and each event of a day, word for word.
#include "libvelmora/watch/watchsettings.h"
#include "tests/libvelmora/watch/drivencar.h"

#include <gtest/gtest.h>

namespace {

using namespace std::chrono_literals;
using velmora::parseDuration;

std::string watchComplaint(std::string const& text)
{
    try {
        velmora::parseWatchSettings(text, "w");
    } catch (velmora::Error const& error) {
        return error.what();
    }
    return "";
}

// A watch that keeps what its events say.
struct ToldWatch
{
    testsupport::DrivenTime time;
    velmora::test::DrivenCar car{time};
    std::vector<std::string> told;
    velmora::WatchEngine engine;

    explicit ToldWatch(velmora::WatchRules rules)
        : engine(
              car, std::move(rules),
              [this](velmora::Record const& record) {
                  if (auto const* const event = std::get_if<velmora::Event>(&record)) {
                      told.push_back(event->kind + ": " + event->text);
                  }
              },
              time.now)
    {}

    std::vector<std::string> run(std::chrono::milliseconds duration)
    {
        told.clear();
        for (auto const end = time.steady() + duration; time.steady() < end; time.pass(100ms)) {
            engine.step(time.now);
        }
        return told;
    }
};

TEST(WatchTexts, ComplainInWholeSentences)
{
    std::string const volts = ": must be a number of volts from 6 to 16, of a 12 V system";
    std::string const duration = ": must be a time in quotes, such as \"90s\" or \"10min\"";
    std::pair<std::string, std::string> const cases[] = {
        {"vehicle = \"a b\"", "w:1: vehicle: must be a name of letters, digits, - and _"},
        {"vehicle = 1", "w:1: vehicle: must be a name of letters, digits, - and _"},
        {"vin = \"x\"", "w:1: vin: must be \"none\" or \"full\""},
        {"vin = \"none\"", ""},
        {"port = 1", "w:1: port: must be a text"},
        {"fast = 1", "w:1: fast: must be true or false"},
        {"codes_every = \"59s\"", "w:1: codes_every" + duration},
        {"codes_every = \"60s\"", ""},
        {"sensors = 1", "w:1: sensors: must be a list of texts, such as [\"RPM\", \"SPEED@10hz\"]"},
        {"signals = 1", "w:1: signals: must be a list of files, such as [\"gearbox.toml\"]"},
        {"output = 1", "w:1: output: must be written as [[output]]"},
        {"output = [1]", "w:1: output.to: is missing: where the output goes, such as \"csv:drive.csv\""},
        {"output = [{ to = \"csv:a\", rotate = 1.5 }]", "w:1: output.rotate: must be a text or a whole number"},
        {"output = [{ to = \"csv:a\", rotate = 5 }]", ""},
        {"battery = 1", "w:1: battery: must be a table: [battery]"},
        {"battery.low_volts = 5.9", "w:1: battery.low_volts" + volts},
        {"battery.low_volts = 6", ""},
        {"battery.running_volts = 16.1", "w:1: battery.running_volts" + volts},
        {"battery.running_volts = 16.0", ""},
        {"battery.wake_change = 0.09",
         "w:1: battery.wake_change: must be a number of volts from 0.1 to 16, of a 12 V system"},
        {"battery.wake_change = 0.1", ""},
        {"battery.settle = \"999ms\"", "w:1: battery.settle" + duration},
        {"battery.settle = \"1s\"", ""},
        {"battery.still_limit = \"1min\"", ""},
        {"battery.voltage_every = 3", "w:1: battery.voltage_every" + duration},
        {"battery.electric = 1", "w:1: battery.electric: must be true or false"},
        {"battery.wake = \"x\"", "w:1: battery.wake: must be \"voltage\" or such as \"every 30min\""},
        {"battery.wake = \"voltage\"", ""},
        {"\nbattery.x = 1",
         "w:2: battery.x: is not known here; adapter_sleep, electric, low_volts, running_volts, settle, "
         "still_limit, stop_after, voltage_every, wake, wake_change are"},
    };
    for (auto const& [text, wrong] : cases) {
        EXPECT_EQ(watchComplaint(text), wrong) << text;
    }
    velmora::WatchSettings const usual = velmora::parseWatchSettings("", "w");
    EXPECT_EQ(usual.codesEvery, 10min);
    EXPECT_FALSE(usual.fullVin || usual.fast);
    EXPECT_TRUE(usual.outputs.empty() && usual.sensors.empty() && usual.signals.empty());
}

TEST(WatchTexts, BoundTimesAndNames)
{
    EXPECT_EQ(parseDuration("1000000ms"), 1000s);
    EXPECT_EQ(parseDuration("1000001ms"), std::nullopt);
    EXPECT_EQ(parseDuration("1ms"), 1ms);
    velmora::BatterySettings battery;
    EXPECT_TRUE(velmora::parseWake("every 1min", battery));
    EXPECT_EQ(battery.wakeEvery, 1min);
    EXPECT_FALSE(velmora::parseWake("every 59s", battery));
    EXPECT_TRUE(velmora::parseWake("every 179s", battery));
    EXPECT_EQ(battery.wakeEvery, 2min);
    EXPECT_FALSE(velmora::parseWake("every", battery));
    EXPECT_FALSE(velmora::parseWake("10min", battery));
    EXPECT_TRUE(velmora::parseWake("voltage", battery));
    EXPECT_EQ(battery.wakeEvery, std::nullopt);
    EXPECT_TRUE(velmora::isVehicleName("azAZ09-_"));
    EXPECT_TRUE(velmora::isVehicleName(std::string(64, 'x')));
    EXPECT_FALSE(velmora::isVehicleName(std::string(65, 'x')));
    for (char const* const odd : {"", "`", "{", "@", "[", "/", ":", ".", " "}) {
        EXPECT_FALSE(velmora::isVehicleName(odd)) << odd;
    }
}

TEST(WatchTexts, TellADay)
{
    using testing::ElementsAre;
    velmora::ClockLook look{1772352900250, 1000, true, "boot"};
    velmora::WatchRules rules;
    rules.vehicle = "van";
    rules.clocks = [&look] { return look; };
    rules.silence = 10s;
    ToldWatch watch(rules);
    EXPECT_THAT(watch.run(2s), ElementsAre("ignition_on: The car answers"));
    EXPECT_FALSE(watch.engine.health().state.empty());
    EXPECT_TRUE(watch.engine.health().linkUp);
    watch.car.rpm = 2000;
    watch.car.kmh = 60;
    EXPECT_THAT(watch.run(2s), ElementsAre("engine_start: The engine runs"));
    EXPECT_EQ(watch.engine.health().state, "running");
    look.wall += 3500;
    EXPECT_THAT(watch.run(2s), ElementsAre("clock_set: The clock was set forward by 3.5 s"));
    look.wall -= 60000;
    EXPECT_THAT(watch.run(2s), ElementsAre("clock_set: The clock was set back by 60.0 s"));
    watch.car.plugged = false;
    EXPECT_THAT(watch.run(1s), ElementsAre("link_lost: no such device"));
    EXPECT_EQ(watch.engine.health().trouble, "no such device");
    EXPECT_EQ(watch.engine.health().linkLosses, 1U);
    EXPECT_FALSE(watch.engine.health().linkUp);
    watch.car.plugged = true;
    EXPECT_THAT(watch.run(5s), ElementsAre("link_back: The link is back"));
    EXPECT_EQ(watch.engine.health().requests, watch.car.asked);
    watch.car.answers = false;
    EXPECT_TRUE(watch.run(8900ms).empty());
    EXPECT_THAT(watch.run(2s), testing::Contains("ignition_off: The car no longer answers"));
    watch.told.clear();
    watch.engine.finish(watch.time.now);
    ASSERT_EQ(watch.told.size(), 1U);
    EXPECT_THAT(watch.told[0], testing::StartsWith("engine_run: 0.")) << "too short for a trip";
}

} // namespace
