#include "tests/support/json/discoveryschema.h"
#include "tests/support/process/broker.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <mutex>

namespace {

using testsupport::brokerContext;
using testsupport::brokerText;
using testsupport::discoveryComplaint;
using testsupport::isEmptied;
using testsupport::mosquittoCommand;
using testsupport::reading;
using testsupport::records;
using testsupport::rowsLeft;
using testsupport::ServerProcess;
using testsupport::Subscriber;
using testsupport::TemporaryFolder;
using velmora::MqttOutput;

TEST(MqttOutput, WhatWasWrittenWithoutABrokerArrivesOnceOneIsThere)
{
    TemporaryFolder const folder;
    unsigned short const port = testsupport::freePort();
    MqttOutput output(velmora::parseOutputAddress(brokerText(port)), brokerContext(folder));
    output.open();
    output.write(records(reading("RPM", 800.0), reading("SPEED", 50.5), reading("STATE", {})));
    EXPECT_EQ(rowsLeft(folder), 3);
    ServerProcess const broker(mosquittoCommand(folder, port), port);
    Subscriber subscriber(port, "-t cars/van/readings", 1);
    EXPECT_TRUE(isEmptied(folder));
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

TEST(MqttOutput, GoesToTheNextNodeWhenOneIsGone)
{
    TemporaryFolder const folder;
    unsigned short const gone = testsupport::freePort();
    unsigned short const port = testsupport::freePort();
    ServerProcess const broker(mosquittoCommand(folder, port), port);
    auto const address = velmora::parseOutputAddress("mqtt://127.0.0.1:" + std::to_string(gone) +
                                                     ",127.0.0.1:" + std::to_string(port) + "/cars?discovery=off");
    MqttOutput output(address, brokerContext(folder));
    output.open();
    output.write(records(reading("RPM", 800.0)));
    EXPECT_TRUE(isEmptied(folder));
    output.close();
}

TEST(MqttOutput, TellsHomeAssistantOfTheCar)
{
    TemporaryFolder const folder;
    unsigned short const port = testsupport::freePort();
    ServerProcess const broker(mosquittoCommand(folder, port), port);
    MqttOutput output(velmora::parseOutputAddress(brokerText(port)), brokerContext(folder));
    output.open();
    velmora::Reading speed = reading("SPEED", 50.0);
    output.write(records(velmora::SensorList{{},
                                             "van",
                                             {{0x7E8, "SPEED", "010D", "Speed", "km/h"},
                                              {0x7E8, "RPM", "010C", "Engine speed", "rpm"},
                                              {0x7E8, "FUEL_RATE", "015E", "Fuel", "l/h"},
                                              {0x7E8, "RUN_TIME", "011F", "Time", "s"},
                                              {0x7E8, "DISTANCE", "0131", "Distance", "km"},
                                              {0x7E8, "BARO", "0133", "Barometer", "kPa"},
                                              {0x7E8, "RATIO", "0144", "Ratio", "lambda"},
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
    auto const components = nlohmann::json::parse(config)["components"];
    EXPECT_EQ(components["7e8_speed"]["device_class"], "speed");
    EXPECT_EQ(components["7e8_speed"]["state_class"], "measurement");
    EXPECT_EQ(components["7e8_run_time"]["state_class"], "total_increasing");
    EXPECT_EQ(components["7e8_distance"]["state_class"], "total_increasing");
    EXPECT_EQ(components["7e8_baro"]["device_class"], "atmospheric_pressure");
    EXPECT_FALSE(components["7e8_ratio"].contains("unit_of_measurement"));
    output.close();
    EXPECT_EQ(Subscriber(port, "-t cars/van/status", 1).lines(), std::vector<std::string>{"cars/van/status offline"});
}

TEST(MqttOutput, WithAConsumersMarkTheSpoolWaitsForThat)
{
    TemporaryFolder const folder;
    unsigned short const port = testsupport::freePort();
    ServerProcess const broker(mosquittoCommand(folder, port), port);
    MqttOutput output(velmora::parseOutputAddress(brokerText(port) + "?ack_topic=cars/van/stored&discovery=off"),
                      brokerContext(folder));
    output.open();
    output.write(records(reading("RPM", 1.0), reading("RPM", 2.0), reading("RPM", 3.0)));
    for (int i = 0; i < 100 && rowsLeft(folder) == 3; ++i) {
        ::usleep(10000);
        output.write({});
    }
    EXPECT_EQ(rowsLeft(folder), 3); // the broker's word alone is not enough
    std::string const id = velmora::Spool(folder.file("spool-van.db"), 1 << 20).id();
    std::string const command = "mosquitto_pub -r -h 127.0.0.1 -p " + std::to_string(port) +
                                " -t cars/van/stored -m '{\"spool\":\"" + id + "\",\"seq\":2}'";
    ASSERT_EQ(std::system(command.c_str()), 0);
    EXPECT_TRUE(testsupport::comesTrue([&] { return rowsLeft(folder) == 1; }));
    output.close();
}

TEST(MqttOutput, FallsBackToTheOldProtocolForABrokerThatHasNoOther)
{
    TemporaryFolder const folder;
    unsigned short const port = testsupport::freePort();
    std::ofstream(folder.file("nats.conf"))
        << "server_name: one\nlisten: \"127.0.0.1:" << testsupport::freePort() << "\"\njetstream { store_dir: \""
        << folder.file("js") << "\" }\nmqtt { listen: \"127.0.0.1:" << port << "\" }\n";
    auto broker = std::make_unique<ServerProcess>(
        std::vector<std::string>{"/usr/sbin/nats-server", "-c", folder.file("nats.conf")}, port);
    velmora::OutputContext context = brokerContext(folder);
    std::atomic<int> losses = 0;
    context.tell = [&losses](std::string const& text) { losses += text.find("no connection") != std::string::npos; };
    MqttOutput output(velmora::parseOutputAddress(brokerText(port) + "?discovery=off"), context);
    output.open();
    output.write(records(reading("RPM", 800.0)));
    EXPECT_TRUE(isEmptied(folder));
    EXPECT_EQ(losses, 0) << "the other protocol is no loss";
    broker.reset();
    EXPECT_TRUE(testsupport::comesTrue([&] { return losses == 1; }));
    output.close();
}

TEST(MqttOutput, AnswersAHomeServerThatWasStartedAndSaysGoodbye)
{
    TemporaryFolder const folder;
    unsigned short const port = testsupport::freePort();
    ServerProcess const broker(mosquittoCommand(folder, port), port);
    std::string const publish =
        "mosquitto_pub -h 127.0.0.1 -p " + std::to_string(port) + " -t homeassistant/status -m ";
    {
        MqttOutput output(velmora::parseOutputAddress(brokerText(port)), brokerContext(folder));
        output.open();
        output.write(records(velmora::SensorList{{}, "van", {{0x7E8, "SPEED", "010D", "Speed", "km/h"}}},
                             reading("SPEED", 50.0)));
        ASSERT_TRUE(isEmptied(folder));
        EXPECT_EQ(output.state().up, true);
        EXPECT_EQ(output.state().waiting, 0U);
        Subscriber subscriber(port, "-t homeassistant/device/# -t homeassistant/status", 4);
        EXPECT_TRUE(subscriber.readLine().starts_with("homeassistant/device/velmora_van/config "));
        ASSERT_EQ(std::system((publish + "offline").c_str()), 0);
        EXPECT_EQ(subscriber.readLine(), "homeassistant/status offline");
        ASSERT_EQ(std::system((publish + "online").c_str()), 0);
        EXPECT_EQ(subscriber.readLine(), "homeassistant/status online");
        EXPECT_TRUE(subscriber.readLine().starts_with("homeassistant/device/velmora_van/config ")) << "told again";
    }
    EXPECT_EQ(Subscriber(port, "-t cars/van/status", 1).lines(), std::vector<std::string>{"cars/van/status offline"})
        << "by its destruction, too";
}

TEST(MqttOutput, TellsALossInTheStreamAndWhatRefusesOnce)
{
    TemporaryFolder const folder;
    std::vector<std::string> told;
    std::mutex mutex;
    velmora::OutputContext context = brokerContext(folder);
    context.tell = [&](std::string const& text) {
        std::lock_guard const lock(mutex);
        told.push_back(text);
    };
    unsigned short const port = testsupport::freePort();
    MqttOutput output(velmora::parseOutputAddress(brokerText(port) + "?discovery=off&spool_max=60k"), context);
    output.open();
    std::string const row(200, 'x');
    std::vector<velmora::SharedRecord> const many(400, records(reading(row, 1.0))[0]);
    output.write(many);
    EXPECT_EQ(output.state().up, false);
    EXPECT_EQ(output.state().waiting, 400U);
    velmora::Database spool(folder.file("spool-van.db"));
    spool.execute("CREATE TRIGGER no BEFORE INSERT ON row BEGIN SELECT RAISE(FAIL, 'no'); END");
    EXPECT_THROW(output.write(records(reading("RPM", 1.0))), velmora::Error);
    EXPECT_EQ(spool.number("SELECT min(seq) FROM row"), 42) << "a tenth had to go";
    spool.execute("DROP TRIGGER no");
    output.write(records(reading("RPM", 1.0)));
    auto const gaps = [&spool] {
        velmora::Statement select(spool, "SELECT text FROM row WHERE text LIKE '%gap%' ORDER BY seq");
        std::vector<nlohmann::json> result;
        while (select.next()) {
            result.push_back(nlohmann::json::parse(select.text(0)));
        }
        return result;
    };
    ASSERT_EQ(gaps().size(), 1U);
    EXPECT_EQ(gaps()[0]["event"], "gap");
    EXPECT_EQ(gaps()[0]["from"], 1) << "from the first that was not told yet";
    EXPECT_EQ(gaps()[0]["to"], spool.number("SELECT min(seq) FROM row") - 1);
    EXPECT_NEAR(gaps()[0]["time"].get<double>(), static_cast<double>(velmora::lookAtClocks().wall), 60000.0);
    spool.execute("CREATE TRIGGER no BEFORE INSERT ON row BEGIN SELECT RAISE(FAIL, 'no'); END");
    EXPECT_THROW(output.write(many), velmora::Error);
    std::int64_t const lost = spool.number("SELECT min(seq) FROM row") - 1;
    spool.execute("DROP TRIGGER no; DELETE FROM row");
    output.write(records(reading("RPM", 1.0)));
    ASSERT_EQ(gaps().size(), 1U) << "told though there is room again";
    EXPECT_EQ(gaps()[0]["to"], lost);
    for (int i = 0; i < 9; ++i) {
        output.write({});
    }
    std::size_t const all = gaps().size();
    output.write({});
    EXPECT_EQ(gaps().size(), all) << "nothing is lost any more";
    output.close();
    output.close();
    auto const times = [&](std::string const& part) {
        return std::ranges::count_if(told,
                                     [&](std::string const& each) { return each.find(part) != std::string::npos; });
    };
    EXPECT_LE(times("the spool is full: its oldest readings were dropped"), 2);
    EXPECT_EQ(times("; readings wait in " + folder.file("spool-van.db")), 1);
    EXPECT_TRUE(told[0].starts_with("mqtt 127.0.0.1: ")) << told[0];
}

// The machine starts in 1970, and a time server sets its clock a while later.
TEST(MqttOutput, TimesOfAClockThatWasWrongAtBootAreRepairedBeforeTheyAreSent)
{
    TemporaryFolder const folder;
    unsigned short const port = testsupport::freePort();
    ServerProcess const broker(mosquittoCommand(folder, port), port);
    velmora::OutputContext context = brokerContext(folder);
    velmora::ClockLook look{1000000, 20000, false, "boot-1"};
    context.clocks = [&look] { return look; };
    auto const address = velmora::parseOutputAddress(brokerText(port) + "?discovery=off");
    {
        MqttOutput output(address, context);
        output.open();
        output.write(records(reading("RPM", 1.0, 999900)));
        output.close(); // the watch is started anew; the machine is not
    }
    MqttOutput output(address, context);
    output.open();
    look = {1002000, 22000, false, "boot-1"};
    output.write(records(reading("RPM", 2.0, 1001000)));
    EXPECT_EQ(rowsLeft(folder), 2);
    std::string const publish = "mosquitto_pub -h 127.0.0.1 -p " + std::to_string(port);
    ASSERT_EQ(std::system((publish + " -r -t here -m 1").c_str()), 0);
    Subscriber subscriber(port, "-t cars/van/readings -t here", 2);
    EXPECT_EQ(subscriber.readLine(), "here 1"); // so the broker has the subscription
    std::int64_t const set = testsupport::march;
    look = {set + 24000, 24000, true, "boot-1"};
    output.write(records(reading("RPM", 3.0, 1003000), reading("RPM", 4.0, set + 23900)));
    std::vector<std::string> const lines = subscriber.lines();
    ASSERT_EQ(lines.size(), 1U);
    ASSERT_TRUE(lines[0].starts_with("cars/van/readings "));
    nlohmann::json const batch = nlohmann::json::parse(lines[0].substr(lines[0].find(' ')));
    std::vector<std::int64_t> times;
    for (auto const& each : batch["readings"]) {
        times.push_back(each.at(1));
    }
    EXPECT_EQ(times, (std::vector<std::int64_t>{set + 19900, set + 21000, set + 23000, set + 23900}));
    EXPECT_EQ(batch["clock"], true);
    output.close();
}

} // namespace
