#include "libvelmora/port/portaddress.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

namespace {

using namespace velmora;

struct AddressCase
{
    char const* text;
    PortAddress expected;
};

TEST(PortAddress, UnderstandsEveryForm)
{
    AddressCase const cases[] = {
        {"/dev/ttyUSB0", SerialAddress{"/dev/ttyUSB0", 38400}},
        {"serial:///dev/ttyUSB0?baud=115200", SerialAddress{"/dev/ttyUSB0", 115200}},
        {"serial:/dev/rfcomm0", SerialAddress{"/dev/rfcomm0", 38400}},
        {"192.168.0.10:35000", TcpAddress{"192.168.0.10", 35000}},
        {"192.168.0.10", TcpAddress{"192.168.0.10", 35000}},
        {"wican.local:3333", TcpAddress{"wican.local", 3333}},
        {"tcp://10.0.0.1:23", TcpAddress{"10.0.0.1", 23}},
        {"tcp:10.0.0.1:23", TcpAddress{"10.0.0.1", 23}},
        {"socket://10.0.0.1", TcpAddress{"10.0.0.1", 35000}},
        {"[fe80::1]:35000", TcpAddress{"fe80::1", 35000}},
        {"tcp://[::1]", TcpAddress{"::1", 35000}},
        {"sim:petrol-can11", SimulatorAddress{"petrol-can11"}},
        {"sim:", SimulatorAddress{""}},
        {"sim:petrol-can11?instant", SimulatorAddress{"petrol-can11", true}},
        {"sim:a.toml?drive=town&adapter=stn2120&scenario=s.txt&fault=garbage=0.01&fault=error:BUS BUSY@2&instant",
         SimulatorAddress{"a.toml", true, "stn2120", "town", "s.txt", {"garbage=0.01", "error:BUS BUSY@2"}}},
        {"replay:car.dialogue", ReplayAddress{"car.dialogue"}},
        {"bt://00:1d:a5:68:98:8b", velmora::BluetoothAddress{"00:1D:A5:68:98:8B", {}}},
        {"bt://00:1D:A5:68:98:8B?channel=30", velmora::BluetoothAddress{"00:1D:A5:68:98:8B", 30}},
        {"bt://00:1D:A5:68:98:8B?channel=2", velmora::BluetoothAddress{"00:1D:A5:68:98:8B", 2}},
        {"ble://AA:BB:CC:DD:EE:FF", velmora::BleAddress{"AA:BB:CC:DD:EE:FF"}},
    };
    for (AddressCase const& row : cases) {
        EXPECT_EQ(parsePortAddress(row.text), row.expected) << row.text;
    }
}

TEST(PortAddress, BaudOptionHoldsWhereTheAddressNamesNone)
{
    EXPECT_EQ(parsePortAddress("/dev/ttyS0", 9600), PortAddress(SerialAddress{"/dev/ttyS0", 9600}));
    EXPECT_EQ(parsePortAddress("serial:///dev/ttyS0?baud=500000", 9600),
              PortAddress(SerialAddress{"/dev/ttyS0", 500000}));
}

TEST(PortAddress, RefusesWhatIsNoAddressAndTellsWhy)
{
    char const* const host = "the host is missing or holds what no host name holds";
    char const* const number = "the port number must be from 1 to 65535";
    char const* const option = "after ? only instant, adapter=NAME, drive=NAME, scenario=FILE and fault=FAULT are";
    char const* const mac = "a Bluetooth address is six pairs of digits, such as 00:1D:A5:68:98:8B";
    std::pair<char const*, char const*> const rows[] = {
        {"", host},
        {":35000", host},
        {"two words", host},
        {"[]:1", host},
        {"host:", "the port number behind the colon is missing"},
        {"host:0", number},
        {"host:65536", number},
        {"host:12a", number},
        {"[::1]:0", number},
        {"[::1", "the closing ] is missing"},
        {"[::1]x", "after ] only :PORT is understood"},
        {"[::1]1", "after ] only :PORT is understood"},
        {"ftp://host", "the kind before :// is unknown"},
        {"ftp:host:21", "only in brackets may a host hold colons, such as [fe80::1]:35000"},
        {"fe80::1", "only in brackets may a host hold colons, such as [fe80::1]:35000"},
        {"replay:", "the file is missing"},
        {"serial://", "the device is missing"},
        {"serial:?baud=9600", "the device is missing"},
        {"/dev/ttyUSB0?rate=1", "after ? only baud=NUMBER is understood"},
        {"/dev/ttyUSB0?baud=x", "after ? only baud=NUMBER is understood"},
        {"/dev/ttyUSB0?baud=0", "after ? only baud=NUMBER is understood"},
        {"sim:x?", option},
        {"sim:x?fast", option},
        {"sim:x?drive=", option},
        {"sim:x?adapter", option},
        {"sim:x?instant&", option},
        {"sim:x?speed=3", option},
        {"bt://", mac},
        {"bt://00:1D:A5:68:98", mac},
        {"bt://00:1D:A5:68:98:8B:", mac},
        {"bt://00-1D-A5-68-98-8B", mac},
        {"bt://G0:1D:A5:68:98:8B", mac},
        {"ble://AA:BB:CC:DD:EE:FG", mac},
        {"ble://AA:BB:CC:DD:EE:FF?x", mac},
        {"bt://00:1D:A5:68:98:8B?channel=31", "after ? only channel=N is understood, from 1 to 30"},
        {"bt://00:1D:A5:68:98:8B?channel=0", "after ? only channel=N is understood, from 1 to 30"},
        {"bt://00:1D:A5:68:98:8B?port=1", "after ? only channel=N is understood, from 1 to 30"},
    };
    for (auto const& [text, why] : rows) {
        try {
            parsePortAddress(text);
            ADD_FAILURE() << text << " was taken";
        } catch (Error const& failure) {
            EXPECT_EQ(failure.kind(), ErrorKind::WrongUse);
            std::string const what = failure.what();
            EXPECT_NE(what.find(std::string(" is no port: ") + why), std::string::npos) << what;
            EXPECT_EQ(failure.hints().size(), 5U) << "each form";
        }
    }
}

TEST(PortAddress, PrintsItselfForMessages)
{
    EXPECT_EQ(toString(parsePortAddress("/dev/ttyUSB0")), "/dev/ttyUSB0 (38400 baud)");
    EXPECT_EQ(toString(parsePortAddress("[::1]:1")), "[::1]:1");
    EXPECT_EQ(toString(parsePortAddress("tcp:host:1")), "host:1");
    EXPECT_EQ(toString(parsePortAddress("replay:a b")), "replay:a b");
    EXPECT_EQ(toString(parsePortAddress("bt://00:1d:a5:68:98:8b?channel=3")), "bt://00:1D:A5:68:98:8B?channel=3");
    EXPECT_EQ(toString(parsePortAddress("bt://00:1d:a5:68:98:8b")), "bt://00:1D:A5:68:98:8B");
    EXPECT_EQ(toString(parsePortAddress("ble://00:1d:a5:68:98:8b")), "ble://00:1D:A5:68:98:8B");
    EXPECT_EQ(toString(parsePortAddress("sim:x")), "sim:x");
    EXPECT_EQ(toString(parsePortAddress("sim:x?instant")), "sim:x?instant");
    char const* const all = "sim:x?instant&adapter=stn2120&drive=town&scenario=s&fault=seed=7&fault=echo";
    EXPECT_EQ(toString(parsePortAddress(all)), all);
}

TEST(PortAddress, DeviceWithoutItsPathIsNoHost)
{
    for (char const* name : {"ttyUSB0", "rfcomm0", "cu.usbserial"}) {
        try {
            parsePortAddress(name, 38400);
            ADD_FAILURE() << name;
        } catch (Error const& error) {
            EXPECT_NE(std::string(error.what()).find(std::string("/dev/") + name), std::string::npos) << error.what();
        }
    }
    EXPECT_EQ(toString(parsePortAddress("tty.example:35000", 38400)), "tty.example:35000") << "a port tells a host";
}

} // namespace
