#include "libvelmora/output/mqttoutput.h"
#include "tests/support/records.h"
#include "tests/support/serverprocess.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdio>
#include <sstream>

namespace {

using testsupport::reading;
using testsupport::records;
using testsupport::ServerProcess;
using testsupport::TemporaryFolder;
using velmora::MqttOutput;
using velmora::Spool;

velmora::OutputContext contextIn(TemporaryFolder const& folder)
{
    velmora::OutputContext context;
    context.vehicle = "van";
    context.stateFolder = folder.path();
    return context;
}

std::string brokerText(unsigned short port)
{
    return "mqtt://127.0.0.1:" + std::to_string(port) + "/cars";
}

std::vector<std::string> mosquittoCommand(TemporaryFolder const& folder, unsigned short port)
{
    std::ofstream(folder.file("broker.conf")) << "listener " << port << " 127.0.0.1\nallow_anonymous true\n";
    return {"/usr/sbin/mosquitto", "-c", folder.file("broker.conf")};
}

// What comes on topics, at most so many messages within 20 s, each a line of topic, blank, payload.
class Subscriber
{
public:
    Subscriber(unsigned short port, std::string const& topics, int count, std::string const& options = "")
        : m_pipe(::popen(("mosquitto_sub -h 127.0.0.1 -V mqttv311 -p " + std::to_string(port) + " " + topics + " -C " +
                          std::to_string(count) + " -W 20 -q 1 -F '%t %p' " + options)
                             .c_str(),
                         "r"))
    {}
    ~Subscriber()
    {
        if (m_pipe != nullptr) {
            ::pclose(m_pipe);
        }
    }
    Subscriber(Subscriber const&) = delete;
    Subscriber& operator=(Subscriber const&) = delete;

    std::vector<std::string> lines()
    {
        std::string all;
        for (char buffer[4096]; std::fgets(buffer, sizeof(buffer), m_pipe) != nullptr;) {
            all += buffer;
        }
        std::vector<std::string> result;
        std::istringstream in(all);
        for (std::string line; std::getline(in, line);) {
            result.push_back(line);
        }
        return result;
    }

private:
    std::FILE* m_pipe;
};

std::int64_t rowsLeft(TemporaryFolder const& folder)
{
    return velmora::Database(folder.file("spool-van.db"), velmora::Database::Access::ReadOnly)
        .number("SELECT count(*) FROM row");
}

bool isEmptied(TemporaryFolder const& folder)
{
    for (int i = 0; i < 400; ++i) {
        if (rowsLeft(folder) == 0) {
            return true;
        }
        ::usleep(50000);
    }
    return false;
}

// 0 if the message is as Home Assistant's discovery wants it.
int discoveryComplaint(TemporaryFolder const& folder, std::string const& message)
{
    std::ofstream(folder.file("message")) << message;
    std::string const program = "import json,sys,jsonschema; a=[json.load(open(f)) for f in sys.argv[1:]]; "
                                "jsonschema.Draft202012Validator(a[0]).validate(a[1])";
    return std::system(("python3 -c '" + program + "' " VELMORA_SOURCE_DIR "/tests/support/homeassistant.schema.json " +
                        folder.file("message") + " 2>/dev/null")
                           .c_str());
}

TEST(MqttSpool, NumbersRiseAndAreNeverUsedAgain)
{
    TemporaryFolder const folder;
    std::string id;
    {
        Spool spool(folder.file("s"), 1 << 20);
        id = spool.id();
        EXPECT_EQ(id.size(), 16U);
        spool.add({"a", "b", "c"});
        spool.forget(2);
        EXPECT_EQ(spool.after(0, 10).size(), 1U);
        spool.forget(3);
    }
    Spool spool(folder.file("s"), 1 << 20);
    EXPECT_EQ(spool.id(), id);
    spool.add({"d"});
    EXPECT_EQ(spool.after(0, 10).at(0).seq, 4);
    EXPECT_NE(Spool(folder.file("t"), 1 << 20).id(), id);
}

TEST(MqttSpool, ACapDropsTheOldestAndTellsWhich)
{
    TemporaryFolder const folder;
    Spool spool(folder.file("s"), 100000);
    EXPECT_EQ(spool.makeRoom().last, 0);
    spool.add(std::vector<std::string>(2000, std::string(100, 'x')));
    Spool::Gap const gap = spool.makeRoom();
    EXPECT_EQ(gap.first, 1);
    EXPECT_EQ(gap.last, 201);
    EXPECT_EQ(spool.dropped(), 201);
    EXPECT_EQ(spool.after(0, 1).at(0).seq, 202);
}

TEST(MqttSettings, RefusesWhatBrokersWouldNotTakeAndSecretsInTheOpen)
{
    TemporaryFolder const folder;
    for (char const* const wrong :
         {"mqtt://b/a.b", "mqtt://b/a b", "mqtt://b/a//b", "mqtt://b/", "mqtt://b:0/a", "mqtt://b:x/a",
          "mqtt://me:pw@b/a", "mqtt://b/a?qos=2", "mqtt://b/a?password_file=/nowhere", "mqtt://b/a?discovery=yes"}) {
        EXPECT_THROW(velmora::mqttSettings(velmora::parseOutputAddress(wrong), contextIn(folder)), velmora::Error)
            << wrong;
    }
    std::ofstream(folder.file("pw")) << "secret\n";
    auto const settings = velmora::mqttSettings(
        velmora::parseOutputAddress("mqtts://b/a/c?password_file=" + folder.file("pw")), contextIn(folder));
    EXPECT_EQ(settings.port, 8883);
    EXPECT_EQ(settings.topic, "a/c/van");
    EXPECT_EQ(settings.password, "secret");
    EXPECT_EQ(velmora::storedMark(R"({"spool":"ab","seq":7})", "ab"), 7);
    for (char const* const wrong : {"", "7", "{}", R"({"spool":"x","seq":7})", R"({"spool":"ab","seq":"7"})", "[1"}) {
        EXPECT_FALSE(velmora::storedMark(wrong, "ab")) << wrong;
    }
}

TEST(MqttOutput, WhatWasWrittenWithoutABrokerArrivesOnceOneIsThere)
{
    TemporaryFolder const folder;
    unsigned short const port = testsupport::freePort();
    MqttOutput output(velmora::parseOutputAddress(brokerText(port)), contextIn(folder));
    output.open();
    output.write(records(reading("RPM", 800.0), reading("SPEED", 50.5), reading("STATE", {})));
    EXPECT_EQ(rowsLeft(folder), 3);
    ServerProcess const broker(mosquittoCommand(folder, port), port);
    Subscriber subscriber(port, "-t cars/van/readings", 1);
    EXPECT_TRUE(isEmptied(folder) || rowsLeft(folder) == 0);
    output.write(records(reading("RPM", 900.0)));
    std::vector<std::string> const lines = subscriber.lines();
    ASSERT_EQ(lines.size(), 1U);
    nlohmann::json const batch = nlohmann::json::parse(lines[0].substr(lines[0].find(' ')));
    EXPECT_EQ(batch["vehicle"], "van");
    ASSERT_FALSE(batch["readings"].empty());
    EXPECT_EQ(batch["readings"].back().at(0), batch["last"]);
    EXPECT_TRUE(isEmptied(folder));
    output.close();
}

TEST(MqttOutput, TellsHomeAssistantOfTheCar)
{
    TemporaryFolder const folder;
    unsigned short const port = testsupport::freePort();
    ServerProcess const broker(mosquittoCommand(folder, port), port);
    MqttOutput output(velmora::parseOutputAddress(brokerText(port)), contextIn(folder));
    output.open();
    velmora::Reading speed = reading("SPEED", 50.0);
    output.write(records(velmora::SensorList{{},
                                             "van",
                                             {{0x7E8, "SPEED", "010D", "Speed", "km/h"},
                                              {0x7E8, "RPM", "010C", "Engine speed", "rpm"},
                                              {0x7E8, "FUEL_RATE", "015E", "Fuel", "l/h"},
                                              {0x7E8, "X", "01C2", "Odd", "furlong"}}},
                         speed));
    ASSERT_TRUE(isEmptied(folder)); // connected
    output.write(records(speed));
    std::map<std::string, std::string> retained;
    for (std::string const& line :
         Subscriber(port, "-t cars/van/status -t cars/van/state -t homeassistant/#", 3).lines()) {
        retained[line.substr(0, line.find(' '))] = line.substr(line.find(' ') + 1);
    }
    EXPECT_EQ(retained["cars/van/status"], "online");
    EXPECT_EQ(retained["cars/van/state"], R"({"7e8_speed":50})");
    std::string const config = retained["homeassistant/device/velmora_van/config"];
    EXPECT_EQ(discoveryComplaint(folder, config), 0);
    EXPECT_NE(discoveryComplaint(folder, R"({"device":{}})"), 0);
    EXPECT_EQ(nlohmann::json::parse(config)["components"]["7e8_speed"]["device_class"], "speed");
    output.close();
    EXPECT_EQ(Subscriber(port, "-t cars/van/status", 1).lines(), std::vector<std::string>{"cars/van/status offline"});
}

TEST(MqttOutput, WithAConsumersMarkTheSpoolWaitsForThat)
{
    TemporaryFolder const folder;
    unsigned short const port = testsupport::freePort();
    ServerProcess const broker(mosquittoCommand(folder, port), port);
    MqttOutput output(velmora::parseOutputAddress(brokerText(port) + "?ack_topic=cars/van/stored&discovery=off"),
                      contextIn(folder));
    output.open();
    output.write(records(reading("RPM", 1.0), reading("RPM", 2.0), reading("RPM", 3.0)));
    for (int i = 0; i < 100 && rowsLeft(folder) == 3; ++i) {
        ::usleep(10000);
        output.write({});
    }
    EXPECT_EQ(rowsLeft(folder), 3); // the broker's word alone is not enough
    std::string const id = Spool(folder.file("spool-van.db"), 1 << 20).id();
    std::string const command = "mosquitto_pub -r -h 127.0.0.1 -p " + std::to_string(port) +
                                " -t cars/van/stored -m '{\"spool\":\"" + id + "\",\"seq\":2}'";
    ASSERT_EQ(std::system(command.c_str()), 0);
    for (int i = 0; i < 400 && rowsLeft(folder) != 1; ++i) {
        ::usleep(50000);
    }
    EXPECT_EQ(rowsLeft(folder), 1);
    output.close();
}

TEST(MqttOutput, FallsBackToTheOldProtocolForABrokerThatHasNoOther)
{
    TemporaryFolder const folder;
    unsigned short const port = testsupport::freePort();
    std::ofstream(folder.file("nats.conf"))
        << "server_name: one\nlisten: \"127.0.0.1:" << testsupport::freePort() << "\"\njetstream { store_dir: \""
        << folder.file("js") << "\" }\nmqtt { listen: \"127.0.0.1:" << port << "\" }\n";
    ServerProcess const broker({"/usr/sbin/nats-server", "-c", folder.file("nats.conf")}, port);
    MqttOutput output(velmora::parseOutputAddress(brokerText(port) + "?discovery=off"), contextIn(folder));
    output.open();
    output.write(records(reading("RPM", 800.0)));
    EXPECT_TRUE(isEmptied(folder));
    output.close();
}

} // namespace
