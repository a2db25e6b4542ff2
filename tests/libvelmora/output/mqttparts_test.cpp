// The parts of the output to brokers, without a broker: settings, the spool's sender, what home servers are told.
#include "libvelmora/output/mqtt/homeassistant.h"
#include "libvelmora/output/mqtt/homestate.h"
#include "libvelmora/output/mqtt/mqttsettings.h"
#include "libvelmora/output/mqtt/spoolsender.h"
#include "libvelmora/output/mqtt/spooltext.h"
#include "tests/support/process/broker.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <deque>

namespace {

using namespace std::chrono_literals;
using testing::ElementsAre;
using testsupport::brokerContext;
using testsupport::TemporaryFolder;
using velmora::SensorEntry;
using velmora::SpoolSender;
using velmora::stateKey;

std::string settingsProblem(TemporaryFolder const& folder, std::string const& address)
{
    try {
        velmora::mqttSettings(velmora::parseOutputAddress(address), brokerContext(folder));
    } catch (velmora::Error const& error) {
        return error.what();
    }
    return "";
}

TEST(MqttParts, SettingsHaveTheirBoundsAndMessages)
{
    TemporaryFolder const folder;
    std::ofstream(folder.file("empty")) << "\n";
    std::string const keep = ": keep_alive is a number of seconds, from 5 to 65535";
    std::string const port = ": the port must be from 1 to 65535";
    std::string const host = ": the host is missing, or a user stands before it: name that in user_file";
    std::pair<std::string, std::string> const cases[] = {
        {"mqtt://b/azAZ09-_/x", ""},
        {"mqtt://b/a{", "mqtt://b/a{: \"a{\" is no topic"},
        {"mqtt://b/a`", "mqtt://b/a`: \"a`\" is no topic"},
        {"mqtt://b/a@", "mqtt://b/a@: \"a@\" is no topic"},
        {"mqtt://b/a[", "mqtt://b/a[: \"a[\" is no topic"},
        {"mqtt://b/a:", "mqtt://b/a:: \"a:\" is no topic"},
        {"mqtt://b/a.", "mqtt://b/a.: \"a.\" is no topic"},
        {"mqtt://b//a", "mqtt://b//a: \"/a\" is no topic"},
        {"mqtt://b/a/", "mqtt://b/a/: \"a/\" is no topic"},
        {"mqtt://b/a//b", "mqtt://b/a//b: \"a//b\" is no topic"},
        {"mqtt://b?keep_alive=5", ""},
        {"mqtt://b?keep_alive=65535", ""},
        {"mqtt://b?keep_alive=4", "mqtt://b" + keep},
        {"mqtt://b?keep_alive=65536", "mqtt://b" + keep},
        {"mqtt://b?keep_alive=x", "mqtt://b" + keep},
        {"mqtt://b:1", ""},
        {"mqtt://b:65535", ""},
        {"mqtt://b:0", "mqtt://b:0" + port},
        {"mqtt://b:65536", "mqtt://b:65536" + port},
        {"mqtt://b:", "mqtt://b:" + port},
        {"mqtt://,b", "mqtt://,b" + host},
        {"mqtt://me@b", "mqtt://me@b" + host},
        {"mqtt://b?qos=2", "mqtt://b: qos is 0 or 1"},
        {"mqtt://b?qos=0", ""},
        {"mqtt://b?discovery=x", "mqtt://b: discovery is device, entity or off"},
        {"mqtt://b?ack_topic=/x", "mqtt://b: ack_topic: \"/x\" is no topic"},
        {"mqtt://b?ack_topic=x", ""},
        {"mqtt://b?user_file=/nowhere", "mqtt://b: user_file names /nowhere, which can't be read or is empty"},
        {"mqtt://b?password_file=" + folder.file("empty"),
         "mqtt://b: password_file names " + folder.file("empty") + ", which can't be read or is empty"},
    };
    for (auto const& [address, wrong] : cases) {
        EXPECT_EQ(settingsProblem(folder, address), wrong) << address;
    }
    auto const usual = velmora::mqttSettings(velmora::parseOutputAddress("mqtt://b"), brokerContext(folder));
    EXPECT_EQ(usual.topic, "velmora/van");
    EXPECT_EQ(usual.qos, 1);
    EXPECT_EQ(usual.keepAlive, 30s);
    EXPECT_EQ(usual.spoolMax, 256ULL << 20);
    EXPECT_EQ(usual.discovery, velmora::Discovery::Device);
    EXPECT_EQ(usual.brokers.at(0).port, 1883);
    EXPECT_FALSE(usual.tls);
    EXPECT_EQ(usual.place.statusTopic, "velmora/van/status");
    EXPECT_EQ(usual.place.stateTopic, "velmora/van/state");
    EXPECT_EQ(usual.place.eventTopic, "velmora/van/event");
    auto const other = velmora::mqttSettings(
        velmora::parseOutputAddress("mqtts://b/x?qos=0&discovery=entity&spool=y&spool_max=1k"), brokerContext(folder));
    EXPECT_EQ(other.qos, 0);
    EXPECT_TRUE(other.tls);
    EXPECT_EQ(other.discovery, velmora::Discovery::Entity);
    EXPECT_EQ(other.spool, "y");
    EXPECT_EQ(other.spoolMax, 1024U);
    EXPECT_FALSE(velmora::storedMark(R"({"spool":"ab"})", "ab"));
    EXPECT_FALSE(velmora::storedMark(R"({"seq":1})", "ab"));
}

// What is not told is nothing, and no value that somebody could take for one.
TEST(MqttParts, RecordsAndRowsBeginWithNothing)
{
    EXPECT_EQ(velmora::ModuleInfo().id, 0U);
    EXPECT_EQ(velmora::CodeChange().module, 0U);
    EXPECT_TRUE(velmora::CodeChange().present);
    EXPECT_EQ(velmora::LampState().module, 0U);
    EXPECT_FALSE(velmora::LampState().on);
    EXPECT_EQ(velmora::ClockLook().wall + velmora::ClockLook().boot, 0);
    EXPECT_FALSE(velmora::ClockLook().synced || velmora::ClockLook().battery);
    EXPECT_EQ(velmora::ClockStamp().offset, 0);
    EXPECT_EQ(velmora::Spool::Row().seq, 0);
    EXPECT_EQ(velmora::Spool::Row().time, velmora::Spool::Time::Sure);
    EXPECT_EQ(velmora::Spool::Gap().first + velmora::Spool::Gap().last, 0);
    EXPECT_EQ(velmora::BatchHead().after + velmora::BatchHead().stored, 0);
    velmora::MqttSettings const settings;
    EXPECT_EQ(settings.qos, 1);
    EXPECT_EQ(settings.keepAlive, 30s);
    EXPECT_EQ(settings.spoolMax, 0U);
    EXPECT_FALSE(settings.tls);
    EXPECT_EQ(velmora::BrokerPlace().port, 1883);
}

TEST(MqttParts, HomeServersAreToldOfEachKindOfSensor)
{
    velmora::HomeAssistantPlace const place{"van", "s", "t", "e"};
    auto const entity = [&place](SensorEntry const& sensor) {
        auto const messages = discoveryMessages(velmora::Discovery::Device, place, {sensor});
        auto const whole = nlohmann::json::parse(messages.at(0).second);
        return whole["components"][stateKey(sensor.module, sensor.sensor)];
    };
    auto const all = entity({0x7E8, "O2 B1.S1", "0114", "Oxygen", "km", 0.0});
    EXPECT_EQ(all, nlohmann::json::parse(R"t({"platform":"sensor","unique_id":"velmora_van_7e8_o2_b1_s1",
        "name":"Oxygen (7E8)","state_topic":"t","value_template":"{{ value_json['7e8_o2_b1_s1'] }}",
        "unit_of_measurement":"km","state_class":"total_increasing","device_class":"distance"})t"));
    std::pair<SensorEntry, char const*> const classes[] = {
        {{1, "A", "", "", "mi"}, "total_increasing"}, {{1, "A", "011F", "", "s"}, "total_increasing"},
        {{1, "A", "0120", "", "s"}, "measurement"},   {{1, "A", "012F", "", "%"}, "measurement"},
        {{1, "A", "", "", "°C"}, "measurement"},
    };
    for (auto const& [sensor, kind] : classes) {
        EXPECT_EQ(entity(sensor)["state_class"], kind) << sensor.unit << sensor.pid;
    }
    EXPECT_FALSE(entity({1, "A", "", "", ""}).contains("state_class"));
    EXPECT_EQ(entity({1, "A", "0133", "", "kPa"})["device_class"], "atmospheric_pressure");
    EXPECT_EQ(entity({1, "A", "0134", "", "kPa"})["device_class"], "pressure");
    EXPECT_EQ(entity({1, "A", "", "", "l/100 km"})["unit_of_measurement"], "L/100km");
    EXPECT_FALSE(entity({1, "A", "", "", "l/100 km"}).contains("device_class"));
    EXPECT_EQ(entity({1, "A", "", "", "furlong"})["unit_of_measurement"], "furlong");
    EXPECT_EQ(stateKey(0xAB, "azAZ09@[`{/:"), "ab_azaz09______");
    std::pair<SensorEntry, std::optional<int>> const expiries[] = {
        {{1, "A", "", "", "V", 0.0}, 60},     {{1, "A", "", "", "V", 0.05}, 60},
        {{1, "A", "", "", "V", 0.049}, 62},   {{1, "A", "", "", "V", 1e-9}, 1000000},
        {{1, "A", "012F", "", "%", 1.0}, {}}, {{1, "A", "015B", "", "%", 1.0}, {}},
        {{1, "A", "", "", "km", 1.0}, {}},    {{1, "A", "011F", "", "s", 1.0}, {}},
    };
    for (auto const& [sensor, seconds] : expiries) {
        EXPECT_EQ(velmora::expirySeconds(sensor), seconds) << sensor.unit << sensor.hertz;
    }
    EXPECT_TRUE(discoveryMessages(velmora::Discovery::Device, place, {}).empty());
    EXPECT_TRUE(discoveryMessages(velmora::Discovery::Off, place, {{1, "A", "", "", ""}}).empty());
}

// A sender whose messages go into a list.
class SpoolSenderTest : public testing::Test
{
protected:
    explicit SpoolSenderTest() : m_spool(m_folder.file("spool.db"), 1 << 20) {}

    SpoolSender sender(bool waitsForMark = false)
    {
        return SpoolSender(
            m_spool, "van", waitsForMark,
            [this](std::string const& text) -> std::optional<int> {
                if (m_full) {
                    return std::nullopt;
                }
                m_sent.push_back(nlohmann::json::parse(text));
                return static_cast<int>(m_sent.size());
            },
            [this](std::string const& text) { m_told.push_back(text); });
    }
    void add(std::size_t count, std::string const& row = "[1]", velmora::Spool::Time time = velmora::Spool::Time::Sure)
    {
        m_spool.add(std::vector<std::string>(count, row), time);
    }

    TemporaryFolder m_folder;
    velmora::Spool m_spool;
    std::vector<nlohmann::json> m_sent;
    std::vector<std::string> m_told;
    bool m_full = false;
    SpoolSender::Time m_now{100h};
};

TEST_F(SpoolSenderTest, SendsBatchesOfWhatAMessageMayHold)
{
    SpoolSender sends = sender();
    add(1001);
    sends.pump();
    EXPECT_TRUE(m_sent.empty()) << "there is no broker yet";
    sends.onUp(m_now);
    sends.pump();
    ASSERT_EQ(m_sent.size(), 2U);
    EXPECT_EQ(m_sent[0]["readings"].size(), 1000U);
    EXPECT_EQ(m_sent[0]["after"], 0);
    EXPECT_EQ(m_sent[1]["after"], 1000);
    EXPECT_EQ(m_sent[1]["stored"], 0);
    sends.onDelivered(1, m_now);
    EXPECT_EQ(m_spool.rows(), 1);
    sends.onDelivered(2, m_now);
    EXPECT_EQ(m_spool.rows(), 0);
    m_sent.clear();
    std::string const half = "[\"" + std::string(50000 - 4, 'x') + "\"]";
    add(2, half);
    add(1, "[2]");
    sends.pump();
    ASSERT_EQ(m_sent.size(), 2U);
    EXPECT_EQ(m_sent[0]["readings"].size(), 2U) << "a hundred thousand bytes are not too much";
    EXPECT_EQ(m_sent[0]["stored"], 1001);
    m_sent.clear();
    add(1, "[\"" + std::string(200000, 'x') + "\"]");
    add(1, "[3]", velmora::Spool::Time::Unsure);
    sends.pump();
    ASSERT_EQ(m_sent.size(), 2U) << "one that is longer goes alone, and so does one of another time";
    EXPECT_EQ(m_sent[1]["clock"], false);
}

TEST_F(SpoolSenderTest, SendsTwentyBatchesAtOnceAndAllAgainAfterALoss)
{
    SpoolSender sends = sender();
    for (int i = 0; i < 21; ++i) {
        add(1, "[1]", i % 2 == 0 ? velmora::Spool::Time::Sure : velmora::Spool::Time::Unsure);
    }
    sends.onUp(m_now);
    sends.pump();
    EXPECT_EQ(m_sent.size(), 20U);
    sends.onDelivered(2, m_now);
    EXPECT_EQ(m_sent.size(), 21U) << "there is room for another";
    EXPECT_EQ(m_spool.rows(), 21) << "the first is still under way";
    sends.onDelivered(1, m_now);
    EXPECT_EQ(m_spool.rows(), 19);
    sends.onDelivered(77, m_now);
    EXPECT_EQ(m_spool.rows(), 19);
    sends.onDown();
    EXPECT_FALSE(sends.isUp());
    m_sent.clear();
    sends.onUp(m_now);
    sends.pump();
    EXPECT_EQ(m_sent.size(), 19U);
    EXPECT_EQ(m_sent[0]["after"], 2);
    sends.onRefused(99);
    sends.pump();
    EXPECT_EQ(m_sent.size(), 19U);
    sends.onRefused(3);
    m_sent.clear();
    m_full = true;
    sends.pump();
    EXPECT_TRUE(m_sent.empty()) << "the link takes nothing now";
    m_full = false;
    sends.pump();
    EXPECT_EQ(m_sent.size(), 19U);
}

TEST_F(SpoolSenderTest, BelievesMarksOfWhatWasSent)
{
    SpoolSender sends = sender(true);
    add(3);
    sends.onUp(m_now);
    sends.pump();
    sends.onDelivered(1, m_now);
    EXPECT_EQ(m_spool.rows(), 3) << "the broker's word is not enough";
    sends.onMark(4, m_now);
    EXPECT_THAT(m_told, ElementsAre("the consumer claims to have stored number 4, which was never sent"));
    sends.onMark(2, m_now);
    EXPECT_EQ(m_spool.rows(), 1);
    sends.onMark(1, m_now);
    EXPECT_EQ(m_spool.rows(), 1) << "an old mark takes nothing back";
    sends.onMark(3, m_now);
    EXPECT_EQ(m_spool.rows(), 0);
}

TEST_F(SpoolSenderTest, LosesPatienceLaterEachTime)
{
    SpoolSender sends = sender(true);
    EXPECT_FALSE(sends.isStuck(m_now));
    sends.onUp(m_now);
    EXPECT_FALSE(sends.isStuck(m_now + 1000s)) << "nothing is under way";
    m_now += 1000s;
    add(2);
    sends.pump();
    EXPECT_FALSE(sends.isStuck(m_now + 29999ms));
    EXPECT_TRUE(sends.isStuck(m_now + 30s));
    m_now += 30s;
    EXPECT_FALSE(sends.isStuck(m_now + 59999ms));
    EXPECT_TRUE(sends.isStuck(m_now + 60s));
    m_now += 60s;
    sends.onMark(1, m_now);
    EXPECT_FALSE(sends.isStuck(m_now + 29999ms));
    EXPECT_TRUE(sends.isStuck(m_now + 30s)) << "progress gives the patience back";
    for (int i = 0; i < 8; ++i) {
        m_now += 1000s;
        sends.isStuck(m_now);
    }
    EXPECT_FALSE(sends.isStuck(m_now + 999s));
    EXPECT_TRUE(sends.isStuck(m_now + 1000s)) << "and never more than that";
    sends.onDown();
    EXPECT_FALSE(sends.isStuck(m_now + 9000s));
}

} // namespace
