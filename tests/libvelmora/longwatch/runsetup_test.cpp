// What a run of the watch makes of what it was told.
#include "libvelmora/longwatch/runsetup.h"
#include "libvelmora/longwatch/watchorder.h"
#include "libvelmora/longwatch/watchrun.h"
#include "libvelmora/session/settingsstore.h"
#include "libvelmora/watch/statefolder.h"
#include "tests/support/openfiles.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>

namespace {

using namespace std::chrono_literals;
using testing::ElementsAre;
using velmora::CarOptions;
using velmora::LongWatchOptions;
using velmora::WatchSettings;

class RunSetup : public testing::Test
{
protected:
    RunSetup() { ::setenv("STATE_DIRECTORY", m_folder.path().c_str(), 1); }
    ~RunSetup() override { ::unsetenv("STATE_DIRECTORY"); }

    testsupport::TemporaryFolder const m_folder;
};

TEST_F(RunSetup, TheCarIsThatOfTheOptionsAndTheRestOfTheSettings)
{
    WatchSettings settings;
    settings.port = "sim:settings";
    settings.sensors = {"RPM@10hz"};
    settings.signals = {"b.toml"};
    settings.fullVin = true;
    settings.fast = true;
    CarOptions options;
    options.signalFiles = {"a.toml"};
    options.units = velmora::Units::Imperial;
    options.sleep = true;
    options.forget = true;
    options.reset = true;
    options.onProgress = [](std::string const&) {};
    options.openPort = [] { return nullptr; };
    velmora::SessionCarOptions const car = velmora::watchedCar(options, settings, "van");
    EXPECT_EQ(car.session.port, "sim:settings");
    EXPECT_EQ(car.session.units, velmora::Units::Metric);
    EXPECT_TRUE(car.session.reset);
    EXPECT_FALSE(car.session.sleep || car.session.forget);
    EXPECT_FALSE(car.session.onProgress || car.session.openPort);
    EXPECT_THAT(car.session.signalFiles, ElementsAre("a.toml", "b.toml"));
    EXPECT_EQ(car.session.settingsFile, m_folder.file("settings.toml")) << "a service has no home";
    EXPECT_EQ(car.vehicle, "van");
    EXPECT_EQ(car.sensors, settings.sensors);
    EXPECT_TRUE(car.fullVin);
    EXPECT_TRUE(car.fast);

    options.port = "sim:options";
    options.settingsFile = "mine.toml";
    velmora::SessionCarOptions const plain = velmora::watchedCar(options, {}, "");
    EXPECT_EQ(plain.session.port, "sim:options");
    EXPECT_EQ(plain.session.settingsFile, "mine.toml");
    EXPECT_FALSE(plain.fullVin || plain.fast);
    EXPECT_FALSE(velmora::SessionCarOptions().fast || velmora::SessionCarOptions().fullVin);
    EXPECT_EQ(velmora::settingsPath(options), "mine.toml");
    options.settingsFile.clear();
    EXPECT_EQ(velmora::settingsPath(options), m_folder.file("settings.toml"));
    ::unsetenv("STATE_DIRECTORY");
    EXPECT_EQ(velmora::watchedCar(options, {}, "").session.settingsFile, "");
    EXPECT_EQ(velmora::settingsPath(options), velmora::SettingsStore::defaultFile());
}

TEST_F(RunSetup, AQueueHasALengthInRecords)
{
    auto const queue = [](std::string const& text) {
        return velmora::limitsOf(velmora::parseOutputAddress("csv:a" + text)).queue;
    };
    EXPECT_EQ(queue(""), 10000U);
    EXPECT_EQ(queue("?queue=1"), 1U);
    EXPECT_EQ(queue("?queue=500"), 500U);
    for (char const* const wrong : {"0", "-1", "5x", "", "99999999999999999999999"}) {
        try {
            queue(std::string("?queue=") + wrong);
            ADD_FAILURE() << wrong;
        } catch (velmora::Error const& error) {
            EXPECT_EQ(std::string(error.what()), "\"" + std::string(wrong) + "\" is no length of a queue");
            EXPECT_EQ(error.kind(), velmora::ErrorKind::WrongUse);
        }
    }
}

TEST_F(RunSetup, AStrangerIsAVehicleThatIsKnownByAnotherName)
{
    WatchSettings settings;
    settings.codesEvery = 7min;
    settings.battery.settle = 9s;
    std::string const name = velmora::vehicleName(settings);
    EXPECT_TRUE(name.starts_with("car-"));
    EXPECT_EQ(velmora::vehicleName(settings), name);
    velmora::WatchRules const rules = velmora::rulesOf(settings, name);
    EXPECT_EQ(rules.vehicle, name);
    EXPECT_EQ(rules.codesEvery, 7min);
    EXPECT_EQ(rules.battery.settle, 9s);
    EXPECT_FALSE(rules.isStranger("VIN-1")) << "the first one gets the name";
    EXPECT_FALSE(rules.isStranger("")) << "nobody knows who that is";
    EXPECT_TRUE(rules.isStranger("VIN-2"));
    EXPECT_FALSE(rules.isStranger("VIN-1"));
    EXPECT_NE(velmora::vehicleName(settings), "van");
    settings.vehicle = "van";
    EXPECT_EQ(velmora::vehicleName(settings), "van");
    EXPECT_FALSE(velmora::rulesOf(settings, "van").isStranger("VIN-2")) << "its name was chosen";
    EXPECT_NE(velmora::rulesOf(settings, "van").seed, velmora::rulesOf(settings, "van").seed);
}

TEST_F(RunSetup, APageHearsTheCarAndTellsWhetherStandardOutputIsFree)
{
    LongWatchOptions options;
    std::vector<velmora::PageLink> links;
    options.onPage = [&links](velmora::PageLink const& link) { links.push_back(link); };
    velmora::OutputAddress const dash = velmora::parseOutputAddress("dash:127.0.0.1:0");
    EXPECT_TRUE(velmora::WatchPage::is(dash));
    for (bool const free : {true, false}) {
        std::vector<velmora::OutputAddress> outputs = {dash};
        if (!free) {
            outputs.push_back(velmora::parseOutputAddress("ndjson:-"));
        }
        velmora::WatchPage const page(outputs, "van", options);
        velmora::SessionCarOptions const tapped = page.withTaps({});
        EXPECT_TRUE(tapped.onReading && tapped.onTraffic);
        auto const output = page.makeOutput(
            dash, [] { return velmora::Health(); }, m_folder.file("settings.toml"));
        output->open();
        output->close();
        ASSERT_FALSE(links.empty());
        EXPECT_EQ(links.back().outputIsFree, free);
    }
    velmora::WatchPage const none({velmora::parseOutputAddress("csv:a")}, "van", options);
    EXPECT_FALSE(none.withTaps({}).onReading || none.withTaps({}).onTraffic) << "nobody listens";
}

TEST_F(RunSetup, OutputsAreEndedOnceWhoeverDoesIt)
{
    LongWatchOptions options;
    options.car.port = "sim:petrol-can11?instant";
    WatchSettings settings;
    settings.vehicle = "van";
    settings.outputs = {velmora::parseOutputAddress("csv-long:" + m_folder.file("a.csv") + "?queue=7")};
    velmora::ServiceNotify notify;
    velmora::WatchRun run(options, settings, notify);
    EXPECT_FALSE(run.health().linkUp);
    EXPECT_TRUE(testsupport::isHeldOpen(m_folder.file("a.csv")));
    EXPECT_TRUE(run.endOutputs());
    EXPECT_FALSE(testsupport::isHeldOpen(m_folder.file("a.csv")));
    EXPECT_FALSE(run.endOutputs()) << "somebody else has done that";
    run.finish();
    run.finish();
    options.car.port.clear();
    EXPECT_THROW(velmora::WatchRun(options, settings, notify), velmora::Error) << "no port is named";
}

// What the options and the file say together.
TEST_F(RunSetup, OptionsStandAboveTheFile)
{
    LongWatchOptions options;
    options.configFile = m_folder.file("watch.toml");
    std::ofstream(options.configFile) << "vehicle = \"bus\"\nvin = \"full\"\nfast = true\nsensors = [\"RPM\"]\n"
                                         "[battery]\nelectric = true\nstop_after = \"50s\"\nwake = \"every 10min\"\n"
                                         "[[output]]\nto = \"csv:a\"\n";
    WatchSettings file = velmora::settingsOf(options);
    EXPECT_EQ(file.vehicle, "bus");
    EXPECT_TRUE(file.fullVin && file.fast && file.battery.electric);
    EXPECT_EQ(file.battery.stopAfter, 50s);
    EXPECT_EQ(file.battery.wakeEvery, 10min);
    EXPECT_THAT(file.sensors, ElementsAre("RPM"));
    options.vehicle = "van";
    options.fullVin = false;
    options.sensors = {"SPEED@1hz", "LOAD"};
    options.outputs = {"ndjson:b"};
    options.stopAfter = "1500ms";
    options.wake = "voltage";
    file = velmora::settingsOf(options);
    EXPECT_EQ(file.vehicle, "van");
    EXPECT_FALSE(file.fullVin);
    EXPECT_TRUE(file.fast);
    EXPECT_THAT(file.sensors, ElementsAre("SPEED@1hz", "LOAD"));
    ASSERT_EQ(file.outputs.size(), 2U);
    EXPECT_EQ(toString(file.outputs[1]), "ndjson:b");
    EXPECT_EQ(file.battery.stopAfter, 1s);
    EXPECT_EQ(file.battery.wakeEvery, std::nullopt);
    options.configFile.clear();
    file = velmora::settingsOf(options);
    EXPECT_FALSE(file.fast || file.battery.electric);
    options.fast = options.electric = true;
    file = velmora::settingsOf(options);
    EXPECT_TRUE(file.fast && file.battery.electric);
}

TEST_F(RunSetup, EachWrongOptionIsNamed)
{
    auto const complaint = [](auto&& change) {
        LongWatchOptions options;
        change(options);
        try {
            velmora::settingsOf(options);
        } catch (velmora::Error const& error) {
            EXPECT_EQ(error.kind(), velmora::ErrorKind::WrongUse);
            return std::string(error.what());
        }
        return std::string();
    };
    std::string const time = " is not a time such as 120s or 5min";
    EXPECT_EQ(complaint([](auto& each) { each.stopAfter = "999ms"; }), "--stop-after: \"999ms\"" + time);
    EXPECT_EQ(complaint([](auto& each) { each.stopAfter = "1s"; }), "");
    EXPECT_EQ(complaint([](auto& each) { each.stopAfter = "x"; }), "--stop-after: \"x\"" + time);
    EXPECT_EQ(complaint([](auto& each) { each.wake = "x"; }),
              "--wake: \"x\" is not \"voltage\" or such as \"every 30min\"");
    EXPECT_EQ(complaint([](auto& each) { each.vehicle = "a b"; }),
              "--vehicle: \"a b\" is not a name of letters, digits, - and _");
    std::string const bad = m_folder.file("bad.toml");
    std::ofstream(bad) << "[x\n";
    std::string const twice = complaint([&bad](auto& each) { each.car.signalFiles = {bad, bad}; });
    EXPECT_EQ(std::ranges::count(twice, '\n'), 1) << twice;
    EXPECT_NE(complaint([](auto& each) { each.sensors = {"RPM", "RPM@x"}; }), "");
    std::ofstream(m_folder.file("watch.toml")) << "signals = [\"bad.toml\"]\n";
    EXPECT_NE(complaint([this](auto& each) { each.configFile = m_folder.file("watch.toml"); }).find("bad.toml:1"),
              std::string::npos);
}

} // namespace
