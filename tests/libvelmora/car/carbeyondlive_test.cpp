// Live values of a car with signals, and what ends their reading.
#include "libvelmora/car/livestate.h"
#include "libvelmora/session/session.h"
#include "tests/libvelmora/car/carbeyond.h"

#include <obd/messagedatamodel.h>
#include <velmora/car.h>
#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <fstream>
#include <thread>

namespace {

using testing::ElementsAre;
using velmora::Car;
using velmora::CarOptions;
using velmora::Error;

using CarBeyondLive = velmora::test::CarBeyond;

TEST_F(CarBeyondLive, EachSensorIsReadOnceAndSignalsBehindThem)
{
    std::ofstream(m_folder.file("own.toml")) << "[[signal]]\nid = \"GEARBOX_TEMP\"\nname = \"Gearbox oil\"\n"
                                                "header = \"7E1\"\nrequest = \"221E1C\"\n"
                                                "formula = \"(A*256+B)/16\"\nunit = \"°C\"\n";
    CarOptions chosen = options("petrol-can11-modules");
    chosen.signalFiles = {m_folder.file("own.toml")};
    Car car(chosen);
    auto const keys = [&car](std::vector<std::string> const& words) {
        std::vector<std::string> result;
        for (velmora::Reading const& each : car.read(words)) {
            result.push_back(each.sensor);
            EXPECT_LT(std::chrono::abs(std::chrono::system_clock::now() - each.time), std::chrono::minutes(1));
        }
        return result;
    };
    EXPECT_THAT(keys({"RPM", "0C", "7E8:RPM", "SPEED"}), ElementsAre("RPM", "SPEED"));
    EXPECT_THAT(keys({"GEARBOX_TEMP", "RPM"}), ElementsAre("RPM", "GEARBOX_TEMP"));
    EXPECT_THAT(keys({"gearbox oil"}), ElementsAre("GEARBOX_TEMP"));
    EXPECT_EQ(keys({}).size(), 5U) << "the usual ones";
    std::unique_ptr<velmora::LiveReader> const reader =
        car.live({.sensors = {"GEARBOX_TEMP", "COOLANT_TEMP"}, .rate = "5hz"});
    EXPECT_EQ(reader->parameters().at(1).at(0).hertz, 5.0) << "of those that have none of their own";
    EXPECT_EQ(reader->parameters().at(0).at(0).module, 0x7E8U) << "the first one, though another was read last";
    car.codeReports();
    EXPECT_NO_THROW(car.keepAsking({"COOLANT_TEMP"})) << "which the first one has alone";

    EXPECT_EQ(car.probe({.module = "743", .reply = "763", .from = "F187", .to = "F187"}).toText({}),
              "  F187  32383430302D5331303034  28400-S1004\n");
}

TEST_F(CarBeyondLive, AWatchEndsWithTheObjectThatHoldsItAndSoDoesItsAsking)
{
    std::atomic<int> asked = 0;
    std::atomic<int> first = 0;
    std::atomic<int> second = 0;
    CarOptions chosen = options();
    chosen.onTraffic = [&asked](obd::MessageDataModel const& entry) {
        asked += entry.direction == obd::MessageDataModel::Sent ? 1 : 0;
    };
    Car car(chosen);
    auto const waitFor = [](std::atomic<int> const& count, int number) {
        for (int i = 0; i < 10000 && count < number; ++i) {
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
        return count >= number;
    };
    velmora::Watch silent = car.watch({"SPEED"}, nullptr);
    velmora::Watch watch = car.watch({"RPM"}, [&first](velmora::Reading const&) { ++first; });
    EXPECT_TRUE(waitFor(first, 2));
    watch = car.watch({"RPM"}, [&second](velmora::Reading const&) { ++second; });
    int const before = first;
    EXPECT_TRUE(waitFor(second, 2));
    EXPECT_EQ(first, before) << "the one that it held has ended";
    velmora::Watch& itself = watch;
    watch = std::move(itself);
    int const now = second;
    EXPECT_TRUE(waitFor(second, now + 1)) << "itself it does not end";
    watch.end();
    silent = velmora::Watch();
    int after = -1;
    for (int i = 0; i < 40 && after != asked; ++i) {
        after = asked;
        std::this_thread::sleep_for(std::chrono::milliseconds(250));
    }
    EXPECT_EQ(asked, after) << "nobody wants a reading any more";
    car.keepAsking({});
    EXPECT_TRUE(waitFor(asked, after + 1)) << "the lamp, which keeps the connection up";
}

TEST_F(CarBeyondLive, LiveValuesMayBeSignalsOfOnesOwn)
{
    std::ofstream(m_folder.file("own.toml")) << R"([[signal]]
id = "GEARBOX_TEMP"
name = "Gearbox oil"
header = "7E1"
request = "221E1C"
formula = "(A*256+B)/16"
unit = "°C"
)";
    CarOptions chosen = options("petrol-can11-modules");
    chosen.signalFiles = {m_folder.file("own.toml")};
    std::unique_ptr<velmora::LiveReader> reader;
    Car car(chosen);
    try {
        reader = car.live({.sensors = {"GEARBOX_TEMP@20hz", "RPM"}, .rate = "5hz"});
    } catch (Error const& error) {
        FAIL() << error;
    }
    auto const parameters = reader->parameters();
    ASSERT_EQ(parameters.size(), 2U);
    velmora::LiveSensor const& own = parameters[1][0];
    EXPECT_TRUE(own.isSignal);
    EXPECT_EQ(own.key, "GEARBOX_TEMP");
    EXPECT_EQ(own.name, "Gearbox oil");
    EXPECT_EQ(own.request, "221E1C");
    EXPECT_EQ(own.unit + own.metricUnit, "°C°C");
    EXPECT_EQ(own.hertz, 20.0);
    EXPECT_TRUE(own.numeric);
    EXPECT_EQ(own.uid, own.id * 10) << "as values name it";
    EXPECT_EQ(parameters[0][0].hertz, 5.0) << "the rate of those that have none of their own";
    EXPECT_EQ(reader->words(), std::vector<std::string>{"7E8:0C@5"});
    EXPECT_EQ(reader->signalTroubles(), "");
    EXPECT_TRUE(reader->isConnected());
    EXPECT_EQ(reader->units(), velmora::Units::Metric);
    EXPECT_NO_THROW(reader->checkAdapter());
    EXPECT_GT(reader->offers().size(), 5U);
    EXPECT_EQ(reader->run().kilograms, 0) << "no run was begun";
    reader->beginRuns();
    EXPECT_GT(reader->run().kilograms, 0);
    EXPECT_EQ(reader->parameters().size(), 2U) << "speed and engine speed";
    reader->endRuns();
    EXPECT_EQ(reader->run().kilograms, 0);
    EXPECT_EQ(reader->parameters().size(), 2U);
    EXPECT_TRUE(reader->parameters()[1][0].isSignal);
    car.reconnect();
    for (auto const& call : std::vector<std::function<void()>>{
             [&] { reader->units(); }, [&] { reader->isConnected(); }, [&] { reader->setMetric(true); },
             [&] { reader->words(); }, [&] { reader->offers(); }, [&] { reader->beginRuns(); },
             [&] { reader->checkAdapter(); }, [&] { reader->signalTroubles(); }}) {
        EXPECT_THROW(call(), Error) << "its connection is over";
    }
    EXPECT_EQ(reader->run().kilograms, 0);
}

TEST_F(CarBeyondLive, LiveValuesAreOfOneModuleOrTheOneThatTellsBoth)
{
    CarOptions chosen = raw(R"([[module]]
id = "7E8"
[module.raw]
"0100" = "41 00 08 08 00 00"
"0105" = "41 05 5A"
"010D" = "41 0D 10"
[[module]]
id = "7E9"
[module.raw]
"0100" = "41 00 00 18 00 00"
"010C" = "41 0C 0F A0"
"010D" = "41 0D 10"
)");
    std::ofstream(m_folder.file("own.toml")) << "[[signal]]\nid = \"OWN\"\nname = \"Own\"\nheader = \"7E0\"\n"
                                                "request = \"0105\"\nformula = \"Z\"\n";
    chosen.signalFiles = {m_folder.file("own.toml")};
    Car car(chosen);
    std::unique_ptr<velmora::LiveReader> reader = car.live({.sensors = {"SPEED"}, .allModules = true});
    EXPECT_EQ(reader->parameters().size(), 2U);
    EXPECT_THAT(reader->modulesText(), testing::MatchesRegex("modules 7E8 .* and 7E9 .*"));
    try {
        reader->picked();
        ADD_FAILURE();
    } catch (Error const& error) {
        EXPECT_STREQ(error.what(), "Sensors of several modules are chosen on the command line");
    }
    reader->beginRuns();
    for (auto const& parameter : reader->parameters()) {
        EXPECT_EQ(parameter[0].module, 0x7E9U) << "the other one has no engine speed";
    }
    EXPECT_EQ(reader->parameters().size(), 2U);
    reader = car.live({.sensors = {"OWN"}});
    EXPECT_EQ(reader->parameters().size(), 1U);
    EXPECT_EQ(reader->modulesText(), "modules ");
    EXPECT_TRUE(reader->words().empty());
    try {
        reader->offers();
        ADD_FAILURE();
    } catch (Error const& error) {
        EXPECT_STREQ(error.what(), "Signals are chosen on the command line");
    }
    std::string troubles;
    for (int i = 0; i < 1000 && troubles.empty(); ++i) {
        reader->wait(std::chrono::milliseconds(5));
        reader->take();
        troubles = reader->signalTroubles();
    }
    EXPECT_TRUE(troubles.starts_with("OWN: replies without a value: ") || troubles.starts_with("OWN ")) << troubles;
}

TEST_F(CarBeyondLive, AFeedThatWasStoppedBringsNothingMore)
{
    velmora::Session session{velmora::SessionOptions(options())};
    session.connect();
    velmora::LiveState state(session, {.sensors = {"RPM"}});
    std::shared_ptr<velmora::LiveFeed> const feed = state.feed();
    EXPECT_TRUE(feed->wait(std::chrono::seconds(20)));
    feed->stop();
    feed->take();
    EXPECT_FALSE(feed->wait(std::chrono::milliseconds(120)));
    EXPECT_EQ(feed->rates().size(), 1U) << "as they were";
    feed->stop();
    state.restart();
    std::shared_ptr<velmora::LiveFeed> const next = state.feed();
    EXPECT_NE(next, feed);
    EXPECT_TRUE(next->wait(std::chrono::seconds(20)));
    state.drop();
    next->take();
    EXPECT_FALSE(next->wait(std::chrono::milliseconds(120))) << "its session may be gone";
    state.drop();
    EXPECT_THROW(state.choice(), Error);
    EXPECT_THROW(state.session(), Error);
    EXPECT_THROW(state.restart(), Error);
}

} // namespace
