#include "libobd/connection/connectionoptions.h"
#include "tests/support/memorysettings.h"

#include <gtest/gtest.h>

#include <limits>

namespace {

using obd::ConnectionOptionsEvent;
using support::MemorySettings;

std::shared_ptr<MemorySettings> storeWith(std::map<std::string, int> ints,
                                          std::map<std::string, std::string> strings = {})
{
    return std::make_shared<MemorySettings>(std::move(ints), std::move(strings));
}

using Devices = std::vector<std::pair<std::string, std::string>>;

Devices devicesOf(obd::ConnectionOptions const& options)
{
    std::vector<obd::BluetoothDescriptor> list{{"left", "over", 1}};
    options.bluetoothDevices(list);
    Devices result;
    for (obd::BluetoothDescriptor const& device : list) {
        EXPECT_EQ(device.port(), 1);
        result.emplace_back(device.name(), device.address());
    }
    return result;
}

TEST(ConnectionOptions, NothingStoredReadsAsTheDefaults)
{
    obd::ConnectionOptions const options(storeWith({}));
    EXPECT_EQ(options.bus(), 0);
    EXPECT_EQ(options.protocol(), obd::VehicleProtocol::Automatic);
    EXPECT_EQ(options.bluetoothDescriptor().name(), "");
    EXPECT_EQ(options.bluetoothDescriptor().address(), "");
    EXPECT_EQ(options.bluetoothDescriptor().port(), 1);
    EXPECT_EQ(options.serialDescriptor().device(), "");
    EXPECT_TRUE(options.serialDescriptor().autoBaudrate());
    EXPECT_EQ(options.serialDescriptor().baudrate(), 9600);
    EXPECT_EQ(options.serialDescriptor().initialBaudrate(), 0);
    EXPECT_EQ(options.serialDescriptor().description(), "");
    EXPECT_EQ(options.tcpDescriptor().address(), "192.168.0.10");
    EXPECT_EQ(options.tcpDescriptor().port(), 35000);
    EXPECT_TRUE(devicesOf(options).empty());
}

TEST(ConnectionOptions, BusAndProtocolOutOfRangeReadAsZero)
{
    for (int const number : {12, 10, -1}) {
        obd::ConnectionOptions const options(storeWith({{"connection/protocol", number}}));
        EXPECT_EQ(options.protocol(), obd::VehicleProtocol::Automatic) << number;
    }
    for (int const number : {3, -1}) {
        obd::ConnectionOptions const options(storeWith({{"connection/bus", number}}));
        EXPECT_EQ(options.bus(), 0) << number;
    }
    obd::ConnectionOptions const highest(storeWith({{"connection/protocol", 9}, {"connection/bus", 2}}));
    EXPECT_EQ(highest.protocol(), obd::VehicleProtocol::Iso15765Can29Bit250);
    EXPECT_EQ(highest.bus(), 2);
}

TEST(ConnectionOptions, BluetoothNeedsAllOfItsKeys)
{
    std::map<std::string, std::string> const texts{{"connection/bt/name", " OBD "}, {"connection/bt/address", "00:1D"}};
    obd::BluetoothDescriptor const full =
        obd::ConnectionOptions(storeWith({{"connection/bt/port", 4}}, texts)).bluetoothDescriptor();
    EXPECT_EQ(full.name(), "OBD");
    EXPECT_EQ(full.address(), "00:1D");
    EXPECT_EQ(full.port(), 4);
    for (char const* missing : {"connection/bt/name", "connection/bt/address", "connection/bt/port"}) {
        auto const store = storeWith({{"connection/bt/port", 4}}, texts);
        store->erase(missing);
        obd::BluetoothDescriptor const none = obd::ConnectionOptions(store).bluetoothDescriptor();
        EXPECT_EQ(none.name(), "") << missing;
        EXPECT_EQ(none.address(), "") << missing;
        EXPECT_EQ(none.port(), 1) << missing;
    }
}

TEST(ConnectionOptions, SerialWithAutoFlagIgnoresTheStoredBaudRate)
{
    obd::ConnectionOptions const options(
        storeWith({{"connection/serial/autobaudrate", 1}, {"connection/serial/baudrate", 38400}},
                  {{"connection/serial/device", "/dev/ttyUSB0"}, {"connection/serial/description", "cable"}}));
    EXPECT_EQ(options.serialDescriptor().device(), "/dev/ttyUSB0");
    EXPECT_EQ(options.serialDescriptor().baudrate(), 9600);
    EXPECT_EQ(options.serialDescriptor().initialBaudrate(), 0);
    EXPECT_TRUE(options.serialDescriptor().autoBaudrate());
    EXPECT_EQ(options.serialDescriptor().description(), "cable");
}

TEST(ConnectionOptions, SerialWithoutAutoFlagTakesTheStoredBaudRates)
{
    auto const store = storeWith({{"connection/serial/autobaudrate", 0},
                                  {"connection/serial/baudrate", 38400},
                                  {"connection/serial/initialbaudrate", 19200}},
                                 {{"connection/serial/device", "/dev/ttyUSB0"}});
    obd::SerialDescriptor const given = obd::ConnectionOptions(store).serialDescriptor();
    EXPECT_FALSE(given.autoBaudrate());
    EXPECT_EQ(given.baudrate(), 38400);
    EXPECT_EQ(given.initialBaudrate(), 19200);
    EXPECT_EQ(given.description(), "");
    store->erase("connection/serial/baudrate");
    store->erase("connection/serial/initialbaudrate");
    obd::SerialDescriptor const defaults = obd::ConnectionOptions(store).serialDescriptor();
    EXPECT_FALSE(defaults.autoBaudrate());
    EXPECT_EQ(defaults.baudrate(), 9600);
    EXPECT_EQ(defaults.initialBaudrate(), 0);
}

TEST(ConnectionOptions, SerialNeedsDeviceAndAutoFlag)
{
    for (char const* missing : {"connection/serial/device", "connection/serial/autobaudrate"}) {
        auto const store = storeWith({{"connection/serial/autobaudrate", 0}, {"connection/serial/baudrate", 38400}},
                                     {{"connection/serial/device", "x"}, {"connection/serial/description", "y"}});
        store->erase(missing);
        obd::SerialDescriptor const none = obd::ConnectionOptions(store).serialDescriptor();
        EXPECT_EQ(none.device(), "") << missing;
        EXPECT_EQ(none.description(), "") << missing;
        EXPECT_TRUE(none.autoBaudrate()) << missing;
        EXPECT_EQ(none.baudrate(), 9600) << missing;
    }
}

TEST(ConnectionOptions, TcpPortWithoutAnAddressGivesTheDefaultsForBoth)
{
    obd::ConnectionOptions const onlyPort(storeWith({{"connection/tcp/port", 23}}));
    EXPECT_EQ(onlyPort.tcpDescriptor().address(), "192.168.0.10");
    EXPECT_EQ(onlyPort.tcpDescriptor().port(), 35000);
    obd::ConnectionOptions const onlyAddress(storeWith({}, {{"connection/tcp/address", "10.0.0.1"}}));
    EXPECT_EQ(onlyAddress.tcpDescriptor().address(), "192.168.0.10");
    EXPECT_EQ(onlyAddress.tcpDescriptor().port(), 35000);
    obd::ConnectionOptions const both(
        storeWith({{"connection/tcp/port", 23}}, {{"connection/tcp/address", "10.0.0.1"}}));
    EXPECT_EQ(both.tcpDescriptor().address(), "10.0.0.1");
    EXPECT_EQ(both.tcpDescriptor().port(), 23);
}

TEST(ConnectionOptions, SettersChangeTheCopyFireAndWriteNothing)
{
    struct Recorder : tervex::IEventListener<ConnectionOptionsEvent>
    {
        std::vector<int> events;
        void onEvent(ConnectionOptionsEvent const& event) override { events.push_back(static_cast<int>(event)); }
    } recorder;
    auto const store = storeWith({});
    obd::ConnectionOptions options(store);
    options.attach(&recorder);
    options.setBus(7);
    options.setProtocol(obd::VehicleProtocol::Iso9141);
    options.setBluetoothDescriptor({"a", "b", 2});
    options.setSerialDescriptor({"c", 1, 2, "d"});
    options.setTcpDescriptor({"e", 3});
    options.setBus(7);
    EXPECT_EQ(recorder.events, (std::vector<int>{1, 2, 3, 4, 5, 1}));
    EXPECT_TRUE(store->writes().empty());
    EXPECT_EQ(options.bus(), 7) << "the range is cut where the store is read";
    EXPECT_EQ(options.protocol(), obd::VehicleProtocol::Iso9141);
    EXPECT_EQ(options.bluetoothDescriptor().port(), 2);
    EXPECT_EQ(options.serialDescriptor().initialBaudrate(), 2);
    EXPECT_EQ(options.tcpDescriptor().address(), "e");
    options.load();
    EXPECT_EQ(recorder.events.size(), 6U) << "loading fires nothing";
    EXPECT_EQ(options.bus(), 0);
    EXPECT_EQ(options.protocol(), obd::VehicleProtocol::Automatic);
    EXPECT_EQ(options.bluetoothDescriptor().name(), "");
    EXPECT_EQ(options.serialDescriptor().device(), "");
    EXPECT_EQ(options.tcpDescriptor().port(), 35000);
}

TEST(ConnectionOptions, SaveWritesEveryKeyInOrder)
{
    auto const store = storeWith({});
    obd::ConnectionOptions options(store);
    options.setBus(1);
    options.setProtocol(obd::VehicleProtocol::Iso15765Can11Bit500);
    options.setBluetoothDescriptor({" OBD ", "00:1D", 2});
    options.setSerialDescriptor({"/dev/ttyUSB0", 38400, 9600, "cable"});
    options.setTcpDescriptor({"10.0.0.1", 23});
    options.save();
    EXPECT_EQ(store->writes(),
              (std::vector<std::string>{
                  "connection/bus=1", "connection/protocol=6", "connection/bt/name=OBD", "connection/bt/address=00:1D",
                  "connection/bt/port=2", "connection/serial/device=/dev/ttyUSB0", "connection/serial/autobaudrate=0",
                  "connection/serial/baudrate=38400", "connection/serial/initialbaudrate=9600",
                  "connection/serial/description=cable", "connection/tcp/address=10.0.0.1", "connection/tcp/port=23"}));
    obd::ConnectionOptions const again(store);
    EXPECT_EQ(again.bus(), 1);
    EXPECT_EQ(again.protocol(), obd::VehicleProtocol::Iso15765Can11Bit500);
    EXPECT_EQ(again.bluetoothDescriptor().name(), "OBD");
    EXPECT_EQ(again.serialDescriptor().initialBaudrate(), 9600);
    EXPECT_EQ(again.tcpDescriptor().port(), 23);
}

TEST(ConnectionOptions, SaveTellsAnAutomaticBaudRate)
{
    auto const store = storeWith({});
    obd::ConnectionOptions options(store);
    options.setSerialDescriptor({"x", "y"});
    options.save();
    int flag = 0;
    EXPECT_TRUE(store->getInt("connection/serial/autobaudrate", flag));
    EXPECT_EQ(flag, 1);
}

TEST(ConnectionOptions, AddBluetoothDeviceTwiceWithEqualNameAndAddressWritesOnce)
{
    auto const store = storeWith({});
    obd::ConnectionOptions options(store);
    options.addBluetoothDevice({"OBD", "00:1D", 1});
    options.addBluetoothDevice({" OBD ", "00:1D", 1});
    EXPECT_EQ(store->writes(),
              (std::vector<std::string>{"bluetooth/1/name=OBD", "bluetooth/1/address=00:1D", "bluetooth/size=1"}));
    EXPECT_EQ(devicesOf(options), (Devices{{"OBD", "00:1D"}}));
}

TEST(ConnectionOptions, SameAddressWithANewNameMovesToTheEndAndRenumbers)
{
    auto const store = storeWith({});
    obd::ConnectionOptions options(store);
    options.addBluetoothDevice({"first", "1", 1});
    options.addBluetoothDevice({"second", "2", 1});
    store->forgetWrites();
    options.addBluetoothDevice({"renamed", "1", 1});
    EXPECT_EQ(devicesOf(options), (Devices{{"second", "2"}, {"renamed", "1"}}));
    EXPECT_EQ(store->writes(),
              (std::vector<std::string>{"bluetooth/1/name=second", "bluetooth/1/address=2", "bluetooth/2/name=renamed",
                                        "bluetooth/2/address=1", "bluetooth/size=2"}));
    EXPECT_EQ(devicesOf(obd::ConnectionOptions(store)), devicesOf(options));
}

TEST(ConnectionOptions, AddBluetoothDeviceFiresNothing)
{
    struct Recorder : tervex::IEventListener<ConnectionOptionsEvent>
    {
        int events = 0;
        void onEvent(ConnectionOptionsEvent const& /*event*/) override { ++events; }
    } recorder;
    obd::ConnectionOptions options(storeWith({}));
    options.attach(&recorder);
    options.addBluetoothDevice({"OBD", "00:1D", 1});
    EXPECT_EQ(recorder.events, 0);
}

TEST(ConnectionOptions, RememberedPositionsWithoutNameOrAddressAreSkipped)
{
    auto const store = storeWith({{"bluetooth/size", 3}}, {{"bluetooth/1/name", "no address"},
                                                           {"bluetooth/2/name", " good "},
                                                           {"bluetooth/2/address", "2"},
                                                           {"bluetooth/3/address", "no name"},
                                                           {"bluetooth/4/name", "beyond"},
                                                           {"bluetooth/4/address", "the size"}});
    EXPECT_EQ(devicesOf(obd::ConnectionOptions(store)), (Devices{{"good", "2"}}));
}

TEST(ConnectionOptions, RememberedSizeOfZeroOrBelowOrNoneLeavesTheListEmpty)
{
    for (int const size : {0, -1, std::numeric_limits<int>::min()}) {
        EXPECT_TRUE(
            devicesOf(obd::ConnectionOptions(storeWith({{"bluetooth/size", size}},
                                                       {{"bluetooth/1/name", "a"}, {"bluetooth/1/address", "b"}})))
                .empty());
    }
    EXPECT_TRUE(
        devicesOf(obd::ConnectionOptions(storeWith({}, {{"bluetooth/1/name", "a"}, {"bluetooth/1/address", "b"}})))
            .empty());
}

TEST(ConnectionOptions, DamagedRememberedSizeKeepsNoReaderBusy)
{
    auto const store = storeWith({{"bluetooth/size", std::numeric_limits<int>::max()}},
                                 {{"bluetooth/9/name", "a"}, {"bluetooth/9/address", "b"}});
    EXPECT_EQ(devicesOf(obd::ConnectionOptions(store)), (Devices{{"a", "b"}}));
}

TEST(ConnectionOptions, LoadKeepsTheRememberedDevices)
{
    auto const store = storeWith({});
    obd::ConnectionOptions options(store);
    options.addBluetoothDevice({"OBD", "00:1D", 1});
    store->setInt("bluetooth/size", 0);
    options.load();
    EXPECT_EQ(devicesOf(options), (Devices{{"OBD", "00:1D"}}));
}

} // namespace
