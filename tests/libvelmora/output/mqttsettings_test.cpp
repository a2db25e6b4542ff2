#include "libvelmora/output/mqtt/mqttsettings.h"
#include "tests/support/process/broker.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

namespace {

using namespace std::chrono_literals;
using testsupport::brokerContext;
using testsupport::TemporaryFolder;

TEST(MqttSettings, RefusesWhatBrokersWouldNotTakeAndSecretsInTheOpen)
{
    TemporaryFolder const folder;
    for (char const* const wrong :
         {"mqtt://b/a.b", "mqtt://b/a b", "mqtt://b/a//b", "mqtt://b/", "mqtt://b:0/a", "mqtt://b:x/a", "mqtt://b,/a",
          "mqtt://b,c:0/a", "mqtt://me:pw@b/a", "mqtt://b/a?qos=2", "mqtt://b/a?password_file=/nowhere",
          "mqtt://b/a?discovery=yes", "mqtt://b/a?keep_alive=4", "mqtt://b/a?keep_alive=1h"}) {
        EXPECT_THROW(velmora::mqttSettings(velmora::parseOutputAddress(wrong), brokerContext(folder)), velmora::Error)
            << wrong;
    }
    std::ofstream(folder.file("pw")) << "secret\n";
    auto const settings = velmora::mqttSettings(
        velmora::parseOutputAddress("mqtts://b/a/c?keep_alive=300&password_file=" + folder.file("pw")),
        brokerContext(folder));
    EXPECT_EQ(settings.brokers.at(0).port, 8883);
    EXPECT_EQ(settings.keepAlive, 300s);
    EXPECT_EQ(settings.topic, "a/c/van");
    EXPECT_EQ(settings.password, "secret");
    auto const cluster =
        velmora::mqttSettings(velmora::parseOutputAddress("mqtt://n1:1,n2,[::1]:3/a"), brokerContext(folder)).brokers;
    ASSERT_EQ(cluster.size(), 3U);
    EXPECT_EQ(cluster[0].host + std::to_string(cluster[0].port), "n11");
    EXPECT_EQ(cluster[1].host + std::to_string(cluster[1].port), "n21883");
    EXPECT_EQ(cluster[2].host + std::to_string(cluster[2].port), "::13");
    EXPECT_EQ(velmora::storedMark(R"({"spool":"ab","seq":7})", "ab"), 7);
    for (char const* const wrong : {"", "7", "{}", R"({"spool":"x","seq":7})", R"({"spool":"ab","seq":"7"})", "[1"}) {
        EXPECT_FALSE(velmora::storedMark(wrong, "ab")) << wrong;
    }
}

} // namespace
