#include "libvelmora/output/eventkinds.h"
#include "libvelmora/output/mqtt/homestate.h"
#include "tests/support/json/discoveryschema.h"
#include "tests/support/records.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using namespace std::chrono_literals;
using testing::Contains;
using testing::Not;
using testsupport::discoveryComplaint;
using testsupport::reading;
using testsupport::TemporaryFolder;
using velmora::Discovery;
using velmora::HomeState;
using Json = nlohmann::json;

struct Home
{
    std::map<std::string, std::string> retained;
    std::vector<std::string> events;
    HomeState state;
    HomeState::Time now{1h};

    explicit Home(Discovery discovery)
        : state(discovery, {"van", "cars/van/status", "cars/van/state", "cars/van/event"},
                [this](std::string const& topic, std::string const& payload, bool retain) {
                    retain ? void(retained[topic] = payload) : events.push_back(topic + " " + payload);
                })
    {}
    Json published()
    {
        now += 2s;
        state.publishState(now);
        return Json::parse(retained["cars/van/state"]);
    }
};

velmora::SensorList carSensors()
{
    return {{},
            "van",
            {{0x7E8, "SPEED", "010D", "Speed", "km/h", 0.0},
             {0x7E8, "COOLANT_TEMP", "0105", "Coolant", "°C", 0.01},
             {0x7E8, "RPM", "010C", "Engine speed", "rpm", 10.0},
             {0x7E8, "FUEL_LEVEL", "012F", "Fuel level", "%", 0.1},
             {0x7E8, "PID_5B", "015B", "Battery", "%", 0.0},
             {0x7E8, "ODOMETER", "01A6", "Odometer", "km", 0.0},
             {0x7E8, "FUEL_STATUS", "0103", "Fuel system", "", 0.0}}};
}

velmora::LampState lampOf(unsigned int module, bool on)
{
    return {{}, "van", module, on};
}

TEST(HomeState, ALiveValueExpiresAndWhatStaysInAParkedCarDoesNot)
{
    Home home(Discovery::Device);
    home.state.take(carSensors(), home.now);
    Json const all = Json::parse(home.retained["homeassistant/device/velmora_van/config"])["components"];
    EXPECT_EQ(all["7e8_speed"]["expire_after"], 60);
    EXPECT_EQ(all["7e8_rpm"]["expire_after"], 60);
    EXPECT_EQ(all["7e8_coolant_temp"]["expire_after"], 300); // three times what lies between two of its values
    EXPECT_EQ(all["7e8_fuel_status"]["expire_after"], 60);
    for (char const* const lasting : {"7e8_fuel_level", "7e8_pid_5b", "7e8_odometer", "lamp", "event"}) {
        ASSERT_TRUE(all.contains(lasting));
        EXPECT_FALSE(all[lasting].contains("expire_after")) << lasting;
    }
}

// A message renews all that it holds: one sensor that fell silent must leave it.
TEST(HomeState, ASensorThatFellSilentIsUnknown)
{
    Home home(Discovery::Device);
    home.state.take(carSensors(), home.now);
    for (char const* const key : {"SPEED", "FUEL_LEVEL", "RPM"}) {
        home.state.take(reading(key, 50.0), home.now);
    }
    EXPECT_EQ(home.published(), Json({{"7e8_fuel_level", 50}, {"7e8_rpm", 50}, {"7e8_speed", 50}}));
    home.now += 56s;
    home.state.take(reading("RPM", 800.0), home.now);
    EXPECT_EQ(home.published()["7e8_speed"], 50);
    home.state.take(carSensors(), home.now); // a link that was lost and back makes nothing young again
    home.state.take(reading("RPM", 801.0), home.now);
    EXPECT_EQ(home.published(), Json({{"7e8_fuel_level", 50}, {"7e8_rpm", 801}, {"7e8_speed", "None"}}));
}

TEST(HomeState, TheStateIsPublishedOnceASecondAtMostAndOnlyIfItChanged)
{
    Home home(Discovery::Device);
    home.state.take(reading("RPM", 1.0), home.now);
    EXPECT_EQ(home.published()["7e8_rpm"], 1);
    home.state.take(reading("RPM", 2.0), home.now);
    home.now += 500ms;
    home.state.publishState(home.now);
    EXPECT_EQ(home.retained["cars/van/state"], R"({"7e8_rpm":1})");
    home.now += 500ms;
    home.state.publishState(home.now);
    EXPECT_EQ(home.retained["cars/van/state"], R"({"7e8_rpm":2})");
    home.retained.clear();
    home.now += 10s;
    home.state.publishState(home.now);
    EXPECT_TRUE(home.retained.empty());
}

TEST(HomeState, HasItsBoundsInTime)
{
    Home home(Discovery::Device);
    home.state.publishState(home.now);
    EXPECT_TRUE(home.retained.empty()) << "nothing is known yet";
    home.state.take(carSensors(), home.now);
    home.state.take(reading("SPEED", 50.0), home.now);
    home.state.take(reading("RPM", {}), home.now);
    EXPECT_EQ(home.published()["7e8_rpm"], "None") << "told, and without a value";
    auto const changes = [&home](std::chrono::milliseconds time) {
        home.retained.clear();
        home.now += time;
        home.state.take(reading("FUEL_LEVEL", 1.0), home.now);
        home.state.publishState(home.now);
        return home.retained.contains("cars/van/state");
    };
    EXPECT_FALSE(changes(899ms));
    EXPECT_TRUE(changes(1ms)) << "a little less than a second";
    EXPECT_TRUE(changes(57100ms)); // a minute after the speed
    EXPECT_EQ(Json::parse(home.retained["cars/van/state"])["7e8_speed"], 50);
    EXPECT_TRUE(changes(900ms));
    EXPECT_EQ(Json::parse(home.retained["cars/van/state"])["7e8_speed"], "None");
}

TEST(HomeState, TheLampIsOneOfAllModulesAndTellsAlsoThatItIsOff)
{
    Home home(Discovery::Device);
    home.state.take(lampOf(0x7E8, false), home.now);
    EXPECT_EQ(home.published(), Json({{"lamp", "OFF"}}));
    home.state.take(lampOf(0x7E9, true), home.now);
    home.state.take(lampOf(0x7E8, false), home.now);
    EXPECT_EQ(home.published(), Json({{"lamp", "ON"}}));
    home.state.take(lampOf(0x7E9, false), home.now);
    EXPECT_EQ(home.published(), Json({{"lamp", "OFF"}}));
}

TEST(HomeState, AnEventIsSaidOnceAndOfAKindThatWasAnnounced)
{
    Home home(Discovery::Device);
    home.state.take(carSensors(), home.now);
    home.state.take(velmora::Event{velmora::fromMillis(testsupport::march), "van", "lamp_on", 0x7E8, "It is on"},
                    home.now);
    ASSERT_EQ(home.events.size(), 1U);
    ASSERT_TRUE(home.events[0].starts_with("cars/van/event {"));
    Json const event = Json::parse(home.events[0].substr(15));
    EXPECT_EQ(event["event_type"], "lamp_on");
    EXPECT_EQ(event["module"], "7E8");
    EXPECT_EQ(event["text"], "It is on");
    EXPECT_EQ(event["time"], "2026-03-01T08:15:00.250Z");
    Json const all = Json::parse(home.retained["homeassistant/device/velmora_van/config"])["components"];
    EXPECT_EQ(all["event"]["state_topic"], "cars/van/event");
    EXPECT_EQ(all["event"]["event_types"].size(), std::size(velmora::eventKinds));
    EXPECT_THAT(all["event"]["event_types"].get<std::vector<std::string>>(), Contains("lamp_on"));
    Home silent(Discovery::Off);
    silent.state.take(carSensors(), silent.now);
    silent.state.take(velmora::Event{{}, "van", "lamp_on", {}, ""}, silent.now);
    EXPECT_TRUE(silent.events.empty());
    EXPECT_TRUE(silent.retained.empty());
}

// Each entity by itself is a component of a device, with what all components of one share.
TEST(HomeState, MessagesOfEitherFormAreAsTheSchemaWants)
{
    TemporaryFolder const folder;
    Home device(Discovery::Device);
    device.state.take(carSensors(), device.now);
    Json whole = Json::parse(device.retained["homeassistant/device/velmora_van/config"]);
    EXPECT_EQ(discoveryComplaint(folder, whole.dump()), 0);
    EXPECT_EQ(whole["qos"], 1);
    Home entity(Discovery::Entity);
    entity.state.take(carSensors(), entity.now);
    ASSERT_EQ(entity.retained.size(), carSensors().sensors.size() + 2);
    Json rebuilt = whole;
    rebuilt["components"].clear();
    for (auto const& [topic, payload] : entity.retained) {
        Json single = Json::parse(payload);
        std::string const platform = topic.substr(14, topic.find('/', 14) - 14);
        EXPECT_EQ(single["availability_topic"], "cars/van/status");
        EXPECT_EQ(single["device"], whole["device"]);
        EXPECT_EQ(single["origin"], whole["origin"]);
        single.erase("device");
        single.erase("origin");
        single.erase("availability_topic");
        single["platform"] = platform;
        std::string const key = topic.substr(topic.find("van/") + 4, topic.rfind('/') - topic.find("van/") - 4);
        rebuilt["components"][key] = single;
    }
    EXPECT_EQ(rebuilt, whole);
    whole["components"]["lamp"]["device_class"] = "lamp";
    EXPECT_NE(discoveryComplaint(folder, whole.dump()), 0);
}

} // namespace
