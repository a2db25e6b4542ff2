#include "tests/support/process/broker.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <regex>

namespace {

using testing::Contains;
using testing::HasSubstr;
using testing::Not;
using testsupport::brokerContext;
using testsupport::isEmptied;
using testsupport::mosquittoCommand;
using testsupport::reading;
using testsupport::records;
using testsupport::rowsLeft;
using testsupport::ServerProcess;
using testsupport::TemporaryFolder;
using velmora::MqttOutput;

// What an output told, from whichever thread.
struct Told
{
    std::mutex mutex;
    std::vector<std::string> texts; // protected by mutex

    velmora::OutputRunner::Tell tell()
    {
        return [this](std::string const& text) {
            std::lock_guard const lock(mutex);
            texts.push_back(text);
        };
    }
    bool holds(std::string const& part)
    {
        std::lock_guard const lock(mutex);
        return std::ranges::any_of(texts,
                                   [&](std::string const& each) { return each.find(part) != std::string::npos; });
    }
};

// An authority that signs for 127.0.0.1, and one that signs for nobody.
void makeCertificates(TemporaryFolder const& folder)
{
    std::string const commands = fmt::format(
        "cd {} && "
        "for ca in ca other; do openssl req -x509 -newkey ec -pkeyopt ec_paramgen_curve:prime256v1 -nodes -days 2 "
        "-keyout $ca.key -out $ca.pem -subj /CN=$ca; done && "
        "openssl req -newkey ec -pkeyopt ec_paramgen_curve:prime256v1 -nodes -keyout broker.key -out broker.csr "
        "-subj /CN=broker && printf 'subjectAltName=IP:127.0.0.1' >san && "
        "openssl x509 -req -in broker.csr -CA ca.pem -CAkey ca.key -CAcreateserial -days 2 -extfile san -out "
        "broker.pem",
        folder.path().string());
    ASSERT_EQ(std::system(("(" + commands + ") >/dev/null 2>&1").c_str()), 0) << "openssl is needed";
}

TEST(MqttSecurity, SpeaksToABrokerThatTheAuthorityVouchesForAndToNoOther)
{
    TemporaryFolder const folder;
    makeCertificates(folder);
    unsigned short const port = testsupport::freePort();
    ServerProcess const broker(mosquittoCommand(folder, port,
                                                "allow_anonymous true\ncertfile " + folder.file("broker.pem") +
                                                    "\nkeyfile " + folder.file("broker.key") + "\n"),
                               port);
    std::string const to = "mqtts://127.0.0.1:" + std::to_string(port) + "/cars?discovery=off&ca=";
    Told told;
    velmora::OutputContext context = brokerContext(folder);
    context.tell = told.tell();
    {
        MqttOutput output(velmora::parseOutputAddress(to + folder.file("other.pem")), context);
        output.open();
        output.write(records(reading("RPM", 1.0)));
        EXPECT_TRUE(testsupport::comesTrue([&] { return told.holds("no connection (A TLS error occurred"); }));
        output.close();
        EXPECT_FALSE(told.holds("connected"));
        EXPECT_EQ(rowsLeft(folder), 1);
    }
    MqttOutput output(velmora::parseOutputAddress(to + folder.file("ca.pem")), context);
    output.open();
    EXPECT_TRUE(isEmptied(folder));
    EXPECT_TRUE(told.holds("connected"));
    output.close();
    MqttOutput senseless(velmora::parseOutputAddress(to + "/nowhere"), context);
    EXPECT_THROW(senseless.open(), velmora::Error);
}

TEST(MqttSecurity, SendsAgainWhatTheBrokersRightsForbade)
{
    TemporaryFolder const folder;
    unsigned short const port = testsupport::freePort();
    std::ofstream(folder.file("rights")) << "topic read #\n";
    ServerProcess const broker(mosquittoCommand(folder, port,
                                                "allow_anonymous true\nacl_file " + folder.file("rights") +
                                                    "\nlog_dest file " + folder.file("log") + "\n"),
                               port);
    Told told;
    velmora::OutputContext context = brokerContext(folder);
    context.tell = told.tell();
    MqttOutput output(velmora::parseOutputAddress(testsupport::brokerText(port) + "?discovery=off"), context);
    output.open();
    output.write(records(reading("RPM", 1.0)));
    EXPECT_TRUE(testsupport::comesTrue([&] { return told.holds("the broker refuses what is sent: Not authorized"); }));
    EXPECT_EQ(rowsLeft(folder), 1);
    std::ofstream(folder.file("rights")) << "topic readwrite #\n";
    broker.reload();
    for (double value = 2.0; rowsLeft(folder) > 0 && value < 200.0; ++value) {
        output.write(records(reading("RPM", value)));
        ::usleep(100000);
    }
    EXPECT_EQ(rowsLeft(folder), 0) << "with the next readings";
    EXPECT_TRUE(testsupport::comesTrue([&] {
        return std::regex_search(folder.read("log"), std::regex(" as velmora-van-[0-9a-f]{8} \\("));
    })) << "who it is, for the broker's log";
    output.close();
}

TEST(MqttSecurity, TakesThePasswordFromAFileOrTheEnvironmentAndTellsItToNobody)
{
    TemporaryFolder const folder;
    ASSERT_EQ(std::system(("mosquitto_passwd -c -b " + folder.file("passwords") + " van hunter2").c_str()), 0);
    unsigned short const port = testsupport::freePort();
    ServerProcess const broker(
        mosquittoCommand(folder, port, "allow_anonymous false\npassword_file " + folder.file("passwords") + "\n"),
        port);
    std::ofstream(folder.file("user")) << "van\n";
    std::ofstream(folder.file("right")) << "hunter2\n";
    std::ofstream(folder.file("wrong")) << "hunter3\n";
    std::string const to =
        testsupport::brokerText(port) + "?discovery=off&user_file=" + folder.file("user") + "&password_file=";
    Told told;
    velmora::OutputContext context = brokerContext(folder);
    context.tell = told.tell();
    {
        MqttOutput output(velmora::parseOutputAddress(to + folder.file("wrong")), context);
        output.open();
        output.write(records(reading("RPM", 1.0)));
        EXPECT_TRUE(testsupport::comesTrue([&] { return told.holds("the broker refuses: Not authorized"); }));
        output.close();
        EXPECT_EQ(rowsLeft(folder), 1);
    }
    {
        MqttOutput output(velmora::parseOutputAddress(to + folder.file("right")), context);
        output.open();
        EXPECT_TRUE(isEmptied(folder));
        output.close();
    }
    ::setenv("VELMORA_MQTT_USER", "van", 1);
    ::setenv("VELMORA_MQTT_PASSWORD", "hunter2", 1);
    MqttOutput output(velmora::parseOutputAddress(testsupport::brokerText(port) + "?discovery=off"), context);
    ::unsetenv("VELMORA_MQTT_USER");
    ::unsetenv("VELMORA_MQTT_PASSWORD");
    output.open();
    output.write(records(reading("RPM", 2.0)));
    EXPECT_TRUE(isEmptied(folder));
    output.close();
    EXPECT_FALSE(told.holds("hunter"));
}

} // namespace
