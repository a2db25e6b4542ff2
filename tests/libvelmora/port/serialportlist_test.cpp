#include "libvelmora/port/opening/portprobe.h"
#include "libvelmora/port/opening/portsearch.h"
#include "libvelmora/vehicle/vehiclekey.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>
#include <cstdlib>
#include <thread>

namespace {

namespace fs = std::filesystem;
using velmora::PortSearch;

// A tree as the kernel shows it: each line's device lies some folders below the one with the product's name.
class SerialPortListTest : public testing::Test
{
protected:
    void line(std::string const& name, std::string const& device, std::string const& productIn = "",
              std::string const& product = "")
    {
        fs::create_directories(m_folder.path() / "devices" / device);
        fs::create_directories(m_folder.path() / "class/tty" / name);
        fs::create_symlink(m_folder.path() / "devices" / device, m_folder.path() / "class/tty" / name / "device");
        if (!productIn.empty()) {
            std::ofstream(m_folder.path() / "devices" / productIn / "product") << product << "\nmore\n";
        }
    }

    testsupport::TemporaryFolder const m_folder;
};

TEST_F(SerialPortListTest, NamesLinesThatMayBeAdapters)
{
    line("ttyUSB1", "usb1/1-2/1-2:1.0/ttyUSB1", "usb1/1-2", "OBD cable");
    line("ttyUSB0", "usb1/1-3/1-3:1.0/ttyUSB0", "usb1/1-3/1-3:1.0/ttyUSB0", "Near");
    line("ttyACM0", "usb2/a/b/c/d", "usb2", "Too far");
    line("rfcomm0", "none");
    line("ttyS0", "serial0", "serial0", "Board");
    std::vector<velmora::SerialPortEntry> const ports = velmora::listSerialPorts(m_folder.path(), "/dev");
    ASSERT_EQ(ports.size(), 4U);
    std::string all;
    for (velmora::SerialPortEntry const& each : ports) {
        all += each.device + "=" + each.description + "\n";
    }
    EXPECT_EQ(all, "/dev/rfcomm0=\n/dev/ttyACM0=\n/dev/ttyUSB0=Near\n/dev/ttyUSB1=OBD cable\n");
    EXPECT_TRUE(velmora::listSerialPorts(m_folder.path() / "none", "/dev").empty());
}

// Where there is no bus, and so no Bluetooth: what is tried shows in what is told.
class BluetoothSearchTest : public testing::Test
{
protected:
    BluetoothSearchTest()
    {
        ::setenv("DBUS_SYSTEM_BUS_ADDRESS", "unix:path=/nonexistent/bus", 1);
        m_search.tell = [this](std::string const& line) { m_told += line; };
        m_search.ports = {{"/dev/velmora-none", ""}};
        m_search.baud = 38400;
        m_search.paired = {{"ble://AA:BB:CC:DD:EE:01", "one", true, true, true},
                           {"ble://AA:BB:CC:DD:EE:02", "two", false, true, true},
                           {"ble://AA:BB:CC:DD:EE:03", "three", true, false, true}};
    }
    ~BluetoothSearchTest() override { ::unsetenv("DBUS_SYSTEM_BUS_ADDRESS"); }

    std::vector<std::string> hints()
    {
        m_told.clear();
        try {
            velmora::findAdapter(m_search);
        } catch (velmora::Error const& error) {
            EXPECT_STREQ(error.what(), "No port is named, and no adapter was found");
            return error.hints();
        }
        return {};
    }

    PortSearch m_search;
    std::string m_told;
};

TEST_F(BluetoothSearchTest, TriesPairedAdaptersBehindTheWires)
{
    std::vector<std::string> const found = hints();
    ASSERT_EQ(found.size(), 6U);
    EXPECT_EQ(found[0], "/dev/velmora-none can't be opened");
    EXPECT_THAT(found[1], testing::HasSubstr("The Bluetooth service can't be asked: there is no system bus"));
    EXPECT_EQ(m_told, "Trying ble://AA:BB:CC:DD:EE:01 ...\nTrying ble://AA:BB:CC:DD:EE:03 ...\n");
    EXPECT_EQ(found[3], "is the adapter plugged in, and does it have power from the car's socket?");
}

TEST_F(BluetoothSearchTest, TriesTheOneOfLastTimeFirst)
{
    m_search.last = velmora::parsePortAddress("ble://AA:BB:CC:DD:EE:02");
    std::vector<std::string> found = hints();
    EXPECT_EQ(m_told, "Trying ble://AA:BB:CC:DD:EE:02 ...\nTrying ble://AA:BB:CC:DD:EE:01 ...\n"
                      "Trying ble://AA:BB:CC:DD:EE:03 ...\n")
        << "though it is not paired";
    ASSERT_EQ(found.size(), 7U);
    EXPECT_EQ(found[3], "/dev/velmora-none can't be opened") << "and the wires behind";
    m_search.last = velmora::parsePortAddress("ble://AA:BB:CC:DD:EE:03");
    hints();
    EXPECT_EQ(m_told, "Trying ble://AA:BB:CC:DD:EE:03 ...\nTrying ble://AA:BB:CC:DD:EE:01 ...\n") << "no one twice";
    m_search.stop = [] { return true; };
    m_told.clear();
    try {
        velmora::findAdapter(m_search);
        ADD_FAILURE() << "went on";
    } catch (velmora::Error const& error) {
        EXPECT_EQ(error.kind(), velmora::ErrorKind::Interrupted);
    }
    EXPECT_EQ(m_told, "Trying ble://AA:BB:CC:DD:EE:03 ...\n") << "and no one else";
}

TEST(PortSearch, SaysWhenThereIsNothingToLookOn)
{
    try {
        velmora::findAdapter({});
        ADD_FAILURE();
    } catch (velmora::Error const& error) {
        EXPECT_STREQ(error.what(), "No port is named, and there is no serial port to look for an adapter on");
        EXPECT_EQ(error.hints().size(), 3U);
    }
    EXPECT_EQ(velmora::toAddressText(velmora::SerialAddress{"/dev/ttyUSB0", 9600}), "serial:///dev/ttyUSB0?baud=9600");
    EXPECT_EQ(velmora::toAddressText(velmora::TcpAddress{"host", 1}), "host:1");
}

// Answers what it is sent with a text, from the same thread.
class ProbedPort : public velmora::IPort
{
public:
    ProbedPort(std::string answer, std::string& written) : m_answer(std::move(answer)), m_written(written) {}

    void start(Receiver onBytes, LossHandler onLost) override
    {
        m_onBytes = std::move(onBytes);
        m_onLost = std::move(onLost);
    }
    void write(std::string_view bytes) override
    {
        m_written += bytes;
        if (m_answer == "lost") {
            m_onLost();
        } else {
            m_onBytes(m_answer);
        }
    }
    void close() override { m_written += "."; }

private:
    std::string const m_answer;
    std::string& m_written;
    Receiver m_onBytes;
    LossHandler m_onLost;
};

TEST(PortProbe, KnowsAnAdapterByItsPrompt)
{
    std::string written;
    auto const answers = [&written](std::string const& answer, velmora::OpeningStop const& stop = {}) {
        return velmora::answersAsAdapter(std::make_unique<ProbedPort>(answer, written), stop);
    };
    EXPECT_TRUE(answers("ELM327 v1.5\r\r>"));
    EXPECT_FALSE(answers("lost"));
    EXPECT_FALSE(answers(std::string(4097, 'x')));
    EXPECT_FALSE(answers("", [] { return true; }));
    EXPECT_EQ(written, "ATI\r.ATI\r.ATI\r.ATI\r.");
    int asked = 0;
    auto const patient = [&asked] { return ++asked > 1; };
    EXPECT_FALSE(answers(std::string(4096, 'x'), patient));
    EXPECT_EQ(asked, 2) << "there may be more of it";
    EXPECT_FALSE(answers(std::string(4097, 'x'), patient));
    EXPECT_FALSE(answers("lost", patient));
    EXPECT_EQ(asked, 2) << "that is nobody's answer, nor is a loss";
}

// As ports do: on a thread of their own, and in pieces.
TEST(PortProbe, WaitsForAnAnswerThatComesLater)
{
    class LaterPort : public velmora::IPort
    {
    public:
        void start(Receiver onBytes, LossHandler /*onLost*/) override { m_onBytes = std::move(onBytes); }
        void write(std::string_view /*bytes*/) override
        {
            m_thread = std::thread([this] {
                m_onBytes("ELM327 ");
                m_onBytes("v1.5\r\r>");
            });
        }
        void close() override { m_thread.join(); }

    private:
        Receiver m_onBytes;
        std::thread m_thread;
    };
    auto const start = std::chrono::steady_clock::now();
    EXPECT_TRUE(velmora::answersAsAdapter(std::make_unique<LaterPort>(), {}));
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(3));
}

// The known answers of FNV-1a with 64 bits.
TEST(VehicleKey, IsAHashOfTheNumber)
{
    EXPECT_EQ(velmora::vehicleKey(""), "vehicle-cbf29ce484222325");
    EXPECT_EQ(velmora::vehicleKey("a"), "vehicle-af63dc4c8601ec8c");
    EXPECT_EQ(velmora::vehicleKey("foobar"), "vehicle-85944171f73967e8");
}

} // namespace
