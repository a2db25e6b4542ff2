#include "libvelmora/output/influxoutput.h"
#include "libvelmora/output/lineprotocol.h"
#include "libvelmora/output/ndjsonoutput.h"
#include "tests/support/openfiles.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <arpa/inet.h>
#include <limits>
#include <sstream>
#include <sys/socket.h>
#include <unistd.h>

namespace {

using testsupport::march;
using testsupport::reading;
using testsupport::records;
using testsupport::TemporaryFolder;
using velmora::parseOutputAddress;
using velmora::toLineProtocol;

TEST(NdjsonOutput, OneObjectAReadingAndAnEvent)
{
    TemporaryFolder const folder;
    velmora::NdjsonOutput output(parseOutputAddress("ndjson:" + folder.file("a")));
    output.open();
    output.write(
        records(reading("RPM", 800.5), reading("STATE", std::string("closed\xFF")), reading("SPEED", {}),
                velmora::Event{velmora::fromMillis(march), "van", "lamp_on", 0x7E8, "Lamp on"},
                velmora::CodeChange{velmora::fromMillis(march), "van", 0x7E8, "P0301", "pending", "x", false}));
    output.close();
    std::istringstream in(folder.read("a"));
    std::vector<nlohmann::json> lines;
    for (std::string line; std::getline(in, line);) {
        lines.push_back(nlohmann::json::parse(line));
    }
    ASSERT_EQ(lines.size(), 5U);
    EXPECT_EQ(lines[0], nlohmann::json::parse(R"({"time":"2026-03-01T08:15:00.250Z","vehicle":"van","module":"7E8",
        "pid":"010C","sensor":"RPM","name":"Name of RPM","value":800.5,"unit":"rpm","raw":"410C1AF8"})"));
    EXPECT_EQ(lines[1]["value"], "closed\xEF\xBF\xBD");
    EXPECT_TRUE(lines[2]["value"].is_null());
    EXPECT_EQ(lines[3]["event"], "lamp_on");
    EXPECT_EQ(lines[4]["event"], "code_cleared");
    EXPECT_EQ(lines[4]["code"], "P0301");
}

TEST(NdjsonOutput, TellsTripsAndNewCodesAndNoLists)
{
    TemporaryFolder const folder;
    velmora::NdjsonOutput output(parseOutputAddress("ndjson:" + folder.file("a")));
    output.open();
    velmora::Trip trip;
    trip.vehicle = "van";
    trip.end = velmora::fromMillis(march);
    output.write(records(velmora::ModuleInfo{}, velmora::SensorList{}, velmora::LampState{}));
    output.write(records(trip, velmora::CodeChange{velmora::fromMillis(march), "van", 0x7E8, "P0301", "pending", "x"}));
    EXPECT_TRUE(testsupport::isHeldOpen(folder.file("a")));
    output.close();
    EXPECT_FALSE(testsupport::isHeldOpen(folder.file("a")));
    EXPECT_EQ(folder.read("a"),
              R"({"time":"2026-03-01T08:15:00.250Z","event":"trip","begin":"1970-01-01T00:00:00.000Z",)"
              R"("end":"2026-03-01T08:15:00.250Z","vehicle":"van","kind":"trip","distance_km":0,"odometer_km":null,)"
              R"("duration_s":0,"idle_s":0,"gap_s":0,"fuel_l":null,"mean_kmh":null,"max_kmh":null,"max_rpm":null,)"
              R"("max_coolant_c":null})"
              "\n"
              R"({"time":"2026-03-01T08:15:00.250Z","vehicle":"van","event":"code","module":"7E8","code":"P0301",)"
              R"("kind":"pending","text":"x"})"
              "\n");
}

TEST(NdjsonOutput, ADayIsOfItsLines)
{
    TemporaryFolder const folder;
    velmora::NdjsonOutput output(parseOutputAddress("ndjson:" + folder.file("a.json") + "?rotate=day"));
    output.open();
    output.write(records(reading("RPM", 1.0)));
    output.write(records(reading("RPM", 2.0, march + 86400000)));
    output.close();
    EXPECT_EQ(nlohmann::json::parse(folder.read("a.json"))["value"], 2.0);
    EXPECT_EQ(nlohmann::json::parse(folder.read("a-20260302T081500Z.json"))["value"], 1.0);
}

TEST(LineProtocol, EscapesAndKeepsTypesApart)
{
    EXPECT_EQ(toLineProtocol(reading("RPM", 800.0)),
              "velmora,vehicle=van,module=7E8,sensor=RPM value=800 1772352900250000000\n");
    velmora::Reading text = reading("STATE", std::string("say \"a\\b\"\n"));
    text.vehicle = "my van,x=1\\";
    EXPECT_EQ(toLineProtocol(text), "velmora,vehicle=my\\ van\\,x\\=1_,module=7E8,sensor=STATE "
                                    "text=\"say \\\"a\\\\b\\\" \" 1772352900250000000\n");
    text.vehicle.clear();
    text.value = 1.5;
    EXPECT_EQ(toLineProtocol(text), "velmora,module=7E8,sensor=STATE value=1.5 1772352900250000000\n");
    EXPECT_EQ(toLineProtocol(reading("RPM", {})), "");
    EXPECT_EQ(toLineProtocol(reading("RPM", std::numeric_limits<double>::quiet_NaN())), "");
}

TEST(InfluxOutput, SendsSeveralLinesADatagramAndNoneTooLong)
{
    int const receiver = ::socket(AF_INET, SOCK_DGRAM, 0);
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t length = sizeof(address);
    ASSERT_EQ(::bind(receiver, reinterpret_cast<sockaddr*>(&address), length), 0);
    ASSERT_EQ(::getsockname(receiver, reinterpret_cast<sockaddr*>(&address), &length), 0);
    auto const output = velmora::makeInfluxOutput(
        parseOutputAddress("influx:udp://127.0.0.1:" + std::to_string(ntohs(address.sin_port))));
    output->open();
    std::vector<velmora::SharedRecord> batch;
    std::string expected;
    for (int i = 0; i < 40; ++i) {
        batch.push_back(std::make_shared<velmora::Record const>(reading("RPM", 1.0 * i, march + i)));
        expected += toLineProtocol(reading("RPM", 1.0 * i, march + i));
    }
    output->write(batch);
    std::string received;
    int datagrams = 0;
    for (char buffer[2000]; received.size() < expected.size(); ++datagrams) {
        ssize_t const count = ::recv(receiver, buffer, sizeof(buffer), 0);
        ASSERT_GT(count, 0);
        ASSERT_LE(count, 1400);
        received.append(buffer, static_cast<std::size_t>(count));
    }
    ::close(receiver);
    EXPECT_EQ(received, expected);
    EXPECT_EQ(datagrams, 3);
}

} // namespace
