// What Bluetooth needs no radio for: pauses between channels, the choice of characteristics, and
// what the service's signals say.

#include "libvelmora/port/bluetooth/gattchoice.h"
#include "libvelmora/port/bluetooth/propertychange.h"
#include "libvelmora/port/bluetooth/rfcommport.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <chrono>
#include <memory>
#include <sys/socket.h>
#include <unistd.h>

namespace {

using namespace std::chrono_literals;
using velmora::GattCharacteristic;

class RefusingDialer : public velmora::IRfcommDialer
{
public:
    velmora::RfcommCall dial(std::string const&, unsigned int, velmora::OpeningStop const&) override
    {
        ++calls;
        return {-1, ECONNREFUSED};
    }
    int calls = 0;
};

TEST(ChannelGuess, PausesBetweenChannelsUnlessItIsStopped)
{
    RefusingDialer dialer;
    auto const start = std::chrono::steady_clock::now();
    EXPECT_THROW(velmora::dialAdapter({"00:1D:A5:68:98:8B", {}}, {{}, dialer, 60ms}, {}), velmora::Error);
    EXPECT_GE(std::chrono::steady_clock::now() - start, 118ms) << "twice";
    EXPECT_LT(std::chrono::steady_clock::now() - start, 5s);
    EXPECT_EQ(dialer.calls, 3);
    int asked = 0;
    auto const stopSoon = [&asked] { return ++asked > 2; };
    auto const second = std::chrono::steady_clock::now();
    EXPECT_THROW(velmora::dialAdapter({"00:1D:A5:68:98:8B", {}}, {{}, dialer, 30s}, stopSoon), velmora::Error);
    EXPECT_LT(std::chrono::steady_clock::now() - second, 10s);
}

TEST(ChannelGuess, EndsWhereItIsInterrupted)
{
    struct CanceledDialer : velmora::IRfcommDialer
    {
        velmora::RfcommCall dial(std::string const&, unsigned int channel, velmora::OpeningStop const&) override
        {
            channels.push_back(channel);
            return {-1, channels.size() < 2 ? ECONNREFUSED : ECANCELED};
        }
        std::vector<unsigned int> channels;
    } dialer;
    try {
        velmora::dialAdapter({"00:1D:A5:68:98:8B", {}}, {{}, dialer, 0ms}, {});
        ADD_FAILURE();
    } catch (velmora::Error const& error) {
        EXPECT_EQ(error.kind(), velmora::ErrorKind::Interrupted);
    }
    EXPECT_EQ(dialer.channels, (std::vector<unsigned int>{1, 2}));
}

GattCharacteristic ofService(std::string const& path, std::string const& uuid, std::string const& name,
                             std::vector<std::string> flags)
{
    return {path + "/" + name, path, uuid, name, std::move(flags)};
}

std::string shortService(std::string const& number)
{
    return "0000" + number + "-0000-1000-8000-00805f9b34fb";
}

// "notify>write" of what was chosen.
std::string chosen(std::vector<GattCharacteristic> const& all)
{
    auto const link = velmora::chooseSerialLink(all);
    return link ? link->notify.uuid + ">" + link->write.uuid : "none";
}

TEST(GattChoices, PreferWhatDoesNothingElse)
{
    std::string const uuid = shortService("fff0");
    GattCharacteristic const both = ofService("/a", uuid, "both", {"notify", "write"});
    GattCharacteristic const tells = ofService("/a", uuid, "tells", {"indicate"});
    GattCharacteristic const takes = ofService("/a", uuid, "takes", {"write-without-response"});
    EXPECT_EQ(chosen({both, tells, takes}), "tells>takes");
    EXPECT_EQ(chosen({takes, both, tells}), "tells>takes");
    EXPECT_EQ(chosen({both, takes}), "both>takes");
    EXPECT_EQ(chosen({both, tells}), "tells>both");
    EXPECT_EQ(chosen({both}), "both>both");
    EXPECT_EQ(chosen({tells}), "none");
    EXPECT_EQ(chosen({takes}), "none");
    EXPECT_EQ(chosen({}), "none");
    EXPECT_EQ(chosen({tells, ofService("/b", uuid, "other", {"write"})}), "none") << "of two services";
}

TEST(GattChoices, GoByTheOrderOfKnownServices)
{
    std::vector<std::string> const known{shortService("fff0"),
                                         shortService("FFE0"),
                                         shortService("18f0"),
                                         "E7810A71-73AE-499D-8C15-FAA9AEF0C3F2",
                                         "49535343-fe7d-4ae5-8fa9-9fafd205e455",
                                         "6e400001-b5a3-f393-e0a9-e50e24dcca9e",
                                         shortService("fee0"),
                                         shortService("abcd")};
    std::vector<GattCharacteristic> all;
    for (std::size_t i = 0; i < known.size(); ++i) { // the last first by their paths
        EXPECT_EQ(velmora::isSerialService(known[i]), i + 1 < known.size()) << known[i];
        all.push_back(ofService("/" + std::to_string(9 - i), known[i], std::to_string(i), {"notify", "write"}));
    }
    for (std::size_t i = 0; i < known.size(); ++i) {
        EXPECT_EQ(chosen(all), std::to_string(i) + ">" + std::to_string(i)) << known[i];
        all.erase(all.begin());
    }
    EXPECT_EQ(chosen({ofService("/1", shortService("fff0"), "mute", {"read"}),
                      ofService("/2", shortService("ffe0"), "good", {"notify", "write"})}),
              "good>good");
    EXPECT_FALSE(velmora::isSerialService("0001fff0-0000-1000-8000-00805f9b34fb")) << "a longer number";
    EXPECT_FALSE(velmora::isSerialService("0000fff0-0000-1000-8000-00805f9b34fc")) << "of somebody's own";
    EXPECT_FALSE(velmora::isSerialService("fff0-0000-1000-8000-00805f9b34fb"));
    EXPECT_TRUE(velmora::isSerialService("fff0"));
}

struct BusGone
{
    void operator()(sd_bus* bus) const { sd_bus_unref(bus); }
    void operator()(sd_bus_message* message) const { sd_bus_message_unref(message); }
};
using OwnMessage = std::unique_ptr<sd_bus_message, BusGone>;

// Signals as they come from the service: a bus whose other end nobody reads.
class PropertySignals : public testing::Test
{
protected:
    PropertySignals()
    {
        EXPECT_EQ(::socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0, m_ends), 0);
        sd_bus* bus = nullptr;
        EXPECT_GE(sd_bus_new(&bus), 0);
        m_bus.reset(bus);
        EXPECT_GE(sd_bus_set_fd(bus, m_ends[0], m_ends[0]), 0);
        EXPECT_GE(sd_bus_start(bus), 0);
    }
    ~PropertySignals() override { ::close(m_ends[1]); }

    // A signal without its values, which are added then.
    OwnMessage begun(bool withInterface = true)
    {
        sd_bus_message* message = nullptr;
        EXPECT_GE(sd_bus_message_new_signal(m_bus.get(), &message, "/x", "org.freedesktop.DBus.Properties",
                                            "PropertiesChanged"),
                  0);
        if (withInterface) {
            sd_bus_message_append(message, "s", "org.bluez.Device1");
            sd_bus_message_open_container(message, 'a', "{sv}");
        }
        return OwnMessage(message);
    }
    static sd_bus_message* ended(OwnMessage const& message, bool withList = true)
    {
        if (withList) {
            sd_bus_message_close_container(message.get());
            sd_bus_message_append(message.get(), "as", 0);
        }
        EXPECT_GE(sd_bus_message_seal(message.get(), 1, 0), 0);
        EXPECT_GE(sd_bus_message_rewind(message.get(), 1), 0);
        return message.get();
    }
    static void add(OwnMessage const& message, char const* key, bool value)
    {
        EXPECT_GE(sd_bus_message_append(message.get(), "{sv}", key, "b", value ? 1 : 0), 0);
    }
    static void addBytes(OwnMessage const& message, char const* key, std::string const& bytes)
    {
        sd_bus_message_open_container(message.get(), 'e', "sv");
        sd_bus_message_append(message.get(), "s", key);
        sd_bus_message_open_container(message.get(), 'v', "ay");
        sd_bus_message_append_array(message.get(), 'y', bytes.data(), bytes.size());
        sd_bus_message_close_container(message.get());
        sd_bus_message_close_container(message.get());
    }

    int m_ends[2] = {-1, -1};
    std::unique_ptr<sd_bus, BusGone> m_bus;
};

TEST_F(PropertySignals, TellThatADeviceIsGone)
{
    OwnMessage const gone = begun();
    add(gone, "ServicesResolved", true);
    add(gone, "Connected", false);
    add(gone, "Paired", true);
    EXPECT_TRUE(velmora::tellsDisconnected(ended(gone)));
    OwnMessage const here = begun();
    add(here, "ServicesResolved", false);
    add(here, "Connected", true);
    EXPECT_FALSE(velmora::tellsDisconnected(ended(here)));
    OwnMessage const other = begun();
    add(other, "Paired", false);
    EXPECT_FALSE(velmora::tellsDisconnected(ended(other)));
    EXPECT_FALSE(velmora::tellsDisconnected(ended(begun())));
}

TEST_F(PropertySignals, TellTheBytesOfAValue)
{
    OwnMessage const value = begun();
    add(value, "Notifying", true);
    addBytes(value, "Value", std::string("41\0>", 4));
    add(value, "Other", true);
    EXPECT_EQ(velmora::changedValue(ended(value)), std::string("41\0>", 4));
    OwnMessage const none = begun();
    addBytes(none, "Data", "41");
    EXPECT_EQ(velmora::changedValue(ended(none)), "");
}

TEST_F(PropertySignals, OfAnotherShapeTellNothing)
{
    OwnMessage const text = begun();
    EXPECT_GE(sd_bus_message_append(text.get(), "{sv}", "Value", "s", "41"), 0);
    addBytes(text, "Value", "42");
    EXPECT_EQ(velmora::changedValue(ended(text)), "") << "and what stands behind is not trusted";
    OwnMessage const number = begun();
    EXPECT_GE(sd_bus_message_append(number.get(), "{sv}", "Connected", "u", 0), 0);
    EXPECT_FALSE(velmora::tellsDisconnected(ended(number)));
    EXPECT_EQ(velmora::changedValue(ended(begun(false), false)), "");
    OwnMessage const bare = begun(false);
    sd_bus_message_append(bare.get(), "s", "org.bluez.Device1");
    EXPECT_FALSE(velmora::tellsDisconnected(ended(bare, false)));
}

} // namespace
