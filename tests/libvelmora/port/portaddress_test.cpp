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

TEST(PortAddress, RefusesWhatIsNoAddressAndTellsTheForms)
{
    for (char const* text : {"",
                             ":35000",
                             "host:",
                             "host:0",
                             "host:65536",
                             "host:12a",
                             "[::1",
                             "[::1]x",
                             "ftp://host",
                             "ftp:host:21",
                             "fe80::1",
                             "replay:",
                             "serial://",
                             "/dev/ttyUSB0?rate=1",
                             "/dev/ttyUSB0?baud=x",
                             "sim:x?",
                             "sim:x?fast",
                             "sim:x?drive=",
                             "sim:x?adapter",
                             "sim:x?instant&",
                             "sim:x?speed=3",
                             "two words",
                             "bt://",
                             "bt://00:1D:A5:68:98",
                             "bt://00-1D-A5-68-98-8B",
                             "bt://00:1D:A5:68:98:8B?channel=31",
                             "bt://00:1D:A5:68:98:8B?channel=0",
                             "ble://AA:BB:CC:DD:EE:FG",
                             "ble://AA:BB:CC:DD:EE:FF?x"}) {
        try {
            parsePortAddress(text);
            ADD_FAILURE() << text << " was taken";
        } catch (Error const& failure) {
            EXPECT_EQ(failure.kind(), ErrorKind::WrongUse);
            EXPECT_NE(std::string(failure.what()).find("is no port"), std::string::npos) << text;
            EXPECT_FALSE(failure.hints().empty());
        }
    }
}

TEST(PortAddress, PrintsItselfForMessages)
{
    EXPECT_EQ(toString(parsePortAddress("/dev/ttyUSB0")), "/dev/ttyUSB0 (38400 baud)");
    EXPECT_EQ(toString(parsePortAddress("[::1]:1")), "[::1]:1");
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
