#include "libvelmora/port/bluetooth/bluetootherror.h"
#include "libvelmora/port/bluetooth/gattchoice.h"
#include "libvelmora/port/bluetooth/rfcommport.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <deque>
#include <future>
#include <sys/socket.h>
#include <unistd.h>

// Bluetooth without a radio: what is tried, in which order, and what is told.

namespace {

using velmora::BluetoothAddress;
using velmora::DialedSocket;
using velmora::Error;
using velmora::ErrorKind;
using velmora::GattCharacteristic;

class FakeDialer : public velmora::IRfcommDialer
{
public:
    explicit FakeDialer(std::deque<velmora::RfcommCall> results) : m_results(std::move(results)) {}

    velmora::RfcommCall dial(std::string const&, unsigned int channel, velmora::OpeningStop const&) override
    {
        channels.push_back(channel);
        velmora::RfcommCall const result = m_results.front();
        m_results.pop_front();
        return result;
    }

    std::vector<unsigned int> channels;

private:
    std::deque<velmora::RfcommCall> m_results;
};

BluetoothAddress const adapter{"00:1D:A5:68:98:8B", {}};

velmora::RfcommWays waysOf(FakeDialer& dialer, velmora::ProfileDialer profile = {})
{
    return {std::move(profile), dialer, std::chrono::milliseconds(0)};
}

std::string failure(BluetoothAddress const& address, velmora::RfcommWays const& ways,
                    velmora::OpeningStop const& stop = {})
{
    try {
        velmora::dialAdapter(address, ways, stop);
    } catch (Error const& error) {
        return (error.kind() == ErrorKind::PortFailed ? "port failed: " : "interrupted: ") + std::string(error.what());
    }
    return "connected";
}

TEST(Rfcomm, NextChannelIsTriedOnlyWhereTheLastWasRefused)
{
    FakeDialer second({{-1, ECONNREFUSED}, {7, 0}});
    EXPECT_EQ(velmora::dialAdapter(adapter, waysOf(second), {}).socket, 7);
    EXPECT_EQ(second.channels, (std::vector<unsigned int>{1, 2}));

    FakeDialer away({{-1, EHOSTDOWN}});
    EXPECT_NE(failure(adapter, waysOf(away)).find("out of reach"), std::string::npos);
    EXPECT_EQ(away.channels, std::vector<unsigned int>{1});

    FakeDialer refusing({{-1, ECONNREFUSED}, {-1, ECONNREFUSED}, {-1, ECONNREFUSED}});
    EXPECT_NE(failure(adapter, waysOf(refusing)).find("refused the connection"), std::string::npos);
    EXPECT_EQ(refusing.channels, (std::vector<unsigned int>{1, 2, 3}));
}

TEST(Rfcomm, NamedChannelGoesPastTheService)
{
    FakeDialer dialer({{9, 0}});
    auto const forbidden = [](std::string const&, velmora::OpeningStop const&) -> std::optional<DialedSocket> {
        ADD_FAILURE() << "the service was asked";
        return std::nullopt;
    };
    EXPECT_EQ(velmora::dialAdapter({adapter.mac, 5}, waysOf(dialer, forbidden), {}).socket, 9);
    EXPECT_EQ(dialer.channels, std::vector<unsigned int>{5});
}

TEST(Rfcomm, ServiceGoesFirstAndTheKernelWhereItRefuses)
{
    FakeDialer unused({});
    auto const giving = [](std::string const&, velmora::OpeningStop const&) { return DialedSocket{4, nullptr}; };
    EXPECT_EQ(velmora::dialAdapter(adapter, waysOf(unused, giving), {}).socket, 4);

    FakeDialer kernel({{5, 0}});
    auto const refusing = [](std::string const&, velmora::OpeningStop const&) -> std::optional<DialedSocket> {
        return std::nullopt;
    };
    EXPECT_EQ(velmora::dialAdapter(adapter, waysOf(kernel, refusing), {}).socket, 5);
}

TEST(Rfcomm, StopEndsTheAttemptAsInterrupted)
{
    FakeDialer stopped({{-1, ECANCELED}});
    EXPECT_EQ(failure(adapter, waysOf(stopped)), "interrupted: Interrupted");
    FakeDialer unused({});
    EXPECT_EQ(failure(adapter, waysOf(unused), [] { return true; }), "interrupted: Interrupted");
}

TEST(Rfcomm, EachErrorNamesItsCauseAndWhatToTry)
{
    std::pair<int, char const*> const rows[] = {
        {EAFNOSUPPORT, "no Bluetooth support"},
        {EPROTONOSUPPORT, "not loaded"},
        {EHOSTUNREACH, "is off"},
        {EHOSTDOWN, "out of reach"},
        {ECONNREFUSED, "refused"},
        {EBADE, "stale"},
        {EACCES, "pairing failed"},
        {EBUSY, "another program"},
        {ETIMEDOUT, "timed out"},
        {ECONNRESET, "adapter closed"},
        {ECONNABORTED, "this computer"},
        {ENOSYS, "(error 38)"},
    };
    for (auto const& [error, words] : rows) {
        Error const told = velmora::rfcommError(adapter.mac, error);
        EXPECT_NE(std::string(told.what()).find(words), std::string::npos) << told.what();
        ASSERT_FALSE(told.hints().empty()) << error;
        EXPECT_EQ(told.hints().front().find("MAC"), std::string::npos) << told.hints().front();
    }
}

// The service's words differ from version to version, so some are told by the error's name and some by its text.
TEST(BluetoothService, EachErrorNamesItsCauseAndWhatToTry)
{
    struct Row
    {
        char const* name;
        char const* text;
        char const* words;
        char const* hint;
    };
    Row const rows[] = {
        {"org.freedesktop.DBus.Error.ServiceUnknown", "", "bluetoothd) is not running", "systemctl start"},
        {"org.freedesktop.DBus.Error.NameHasNoOwner", "", "bluetoothd) is not running", "systemctl start"},
        {"org.bluez.Error.NotReady", "no controller", "no Bluetooth controller", "rfkill list"},
        {"org.bluez.Error.NotReady", "Resource Not Ready", "Bluetooth is off", "power on"},
        {"org.bluez.Error.Failed", "br-connection-adapter-not-powered", "Bluetooth is off", "power on"},
        {"org.freedesktop.DBus.Error.AccessDenied", "", "may not use Bluetooth", "group bluetooth"},
        {"org.bluez.Error.AuthenticationRejected", "x", "demands pairing", "ports pair"},
        {"org.bluez.Error.NotAuthorized", "x", "demands pairing", "ports pair"},
        {"org.bluez.Error.NotPermitted", "x", "demands pairing", "ports pair"},
        {"org.freedesktop.DBus.Error.NoReply", "", "out of reach", "plugged in"},
        {"org.bluez.Error.Failed", "br-connection-page-timeout", "out of reach", "plugged in"},
        {"org.bluez.Error.Failed", "le-connection-abort-by-local", "out of reach", "plugged in"},
        {"org.bluez.Error.InProgress", "", "another program", "close"},
        {"org.bluez.Error.Failed", "br-connection-busy", "another program", "close"},
        {"org.bluez.Error.Failed", "br-connection-unknown", "br-connection-unknown (org.bluez", "velmora ports"},
    };
    for (Row const& row : rows) {
        Error const told = velmora::bluezError("Could not connect", row.name, row.text);
        std::string const what = told.what();
        EXPECT_EQ(what.find("Could not connect: "), 0U) << what;
        EXPECT_NE(what.find(row.words), std::string::npos) << row.name << " " << what;
        ASSERT_FALSE(told.hints().empty()) << row.name;
        EXPECT_NE(told.hints().front().find(row.hint), std::string::npos) << told.hints().front();
    }
}

TEST(Rfcomm, SocketAddressIsAsTheKernelReadsIt)
{
    velmora::RfcommSocketAddress const address = velmora::makeRfcommAddress("AA:BB:CC:DD:EE:01", 3);
    EXPECT_EQ(address.family, 31);
    EXPECT_EQ(address.device, (std::array<std::uint8_t, 6>{0x01, 0xEE, 0xDD, 0xCC, 0xBB, 0xAA}));
    EXPECT_EQ(address.channel, 3);
}

// On a machine without Bluetooth, as those of tests are, the kernel says so itself.
TEST(Rfcomm, KernelsOwnErrorIsTold)
{
    velmora::KernelRfcomm kernel;
    velmora::RfcommCall const call = kernel.dial("02:00:00:00:00:01", 30, [] { return true; });
    EXPECT_EQ(call.socket, -1);
    EXPECT_NE(call.error, 0);
}

TEST(Rfcomm, PortCarriesBytesAndTellsTheLoss)
{
    int ends[2];
    ASSERT_EQ(::socketpair(AF_UNIX, SOCK_STREAM, 0, ends), 0);
    auto const keeper = std::make_shared<int>(0);
    auto port = velmora::makeSocketPort({ends[0], keeper});
    std::promise<std::string> received;
    std::promise<void> lost;
    port->start([&](std::string_view bytes) { received.set_value(std::string(bytes)); }, [&] { lost.set_value(); });
    port->write("ATI\r");
    char bytes[16];
    EXPECT_EQ(::read(ends[1], bytes, sizeof(bytes)), 4);
    ASSERT_EQ(::write(ends[1], "ELM>", 4), 4);
    EXPECT_EQ(received.get_future().get(), "ELM>");
    ::close(ends[1]);
    lost.get_future().get();
    EXPECT_EQ(keeper.use_count(), 2);
    port.reset();
    EXPECT_EQ(keeper.use_count(), 1) << "what keeps the link goes with the port";
}

GattCharacteristic characteristic(std::string const& service, std::string const& uuid, std::vector<std::string> flags)
{
    return {"/" + service + "/" + uuid, "/" + service, service + "-0000-1000-8000-00805f9b34fb", uuid,
            std::move(flags)};
}

TEST(GattChoice, KnownServiceGoesFirstAndFlagsTellTheRoles)
{
    auto const link = velmora::chooseSerialLink({
        characteristic("00001234", "other", {"notify", "write"}),
        characteristic("0000fff0", "fff2", {"notify"}),
        characteristic("0000fff0", "fff1", {"write", "write-without-response"}),
    });
    ASSERT_TRUE(link);
    EXPECT_EQ(link->notify.uuid, "fff2");
    EXPECT_EQ(link->write.uuid, "fff1");
    EXPECT_TRUE(link->writesWithoutResponse());
}

TEST(GattChoice, OneCharacteristicMayDoBoth)
{
    auto const link = velmora::chooseSerialLink({characteristic("0000ffe0", "ffe1", {"indicate", "write"})});
    ASSERT_TRUE(link);
    EXPECT_EQ(link->notify.uuid, link->write.uuid);
    EXPECT_FALSE(link->writesWithoutResponse());
}

TEST(GattChoice, StandardAndUpdateServicesAreNoSerialOnes)
{
    std::vector<GattCharacteristic> all;
    for (char const* const service : {"00001800", "00001801", "0000180a", "0000180f", "0000fef5"}) {
        all.push_back(characteristic(service, "both", {"notify", "write"}));
    }
    EXPECT_FALSE(velmora::chooseSerialLink(all));
    all.push_back(characteristic("0000abcd", "in", {"notify"}));
    EXPECT_FALSE(velmora::chooseSerialLink(all)) << "nothing takes bytes";
    all.push_back(characteristic("0000abcd", "out", {"write"}));
    ASSERT_TRUE(velmora::chooseSerialLink(all));
    EXPECT_EQ(velmora::chooseSerialLink(all)->write.uuid, "out");
    EXPECT_TRUE(velmora::isSerialService("0000FFF0-0000-1000-8000-00805F9B34FB"));
    EXPECT_FALSE(velmora::isSerialService("0000110b-0000-1000-8000-00805f9b34fb"));
}

} // namespace
