#include "libvelmora/port/bluetooth/profiledial.h"

#include "libvelmora/port/bluetooth/bluez.h"

#include <unistd.h>
#include <utility>

namespace velmora {

namespace {

constexpr char const* objectPath = "/velmora/serialport";
constexpr char const* dialledService = "00001101-0000-1000-8000-00805f9b34fb";
constexpr char const* managerPath = "/org/bluez";
constexpr char const* profileManagerInterface = "org.bluez.ProfileManager1";
constexpr std::chrono::seconds dialConnectLimit{30};

int keepConnection(sd_bus_message* message, void* socket, sd_bus_error* error)
{
    int descriptor = -1;
    if (sd_bus_message_skip(message, "o") < 0 || sd_bus_message_read(message, "h", &descriptor) < 0) {
        return sd_bus_error_set(error, "org.bluez.Error.Rejected", "not understood");
    }
    try {
        int const earlier = std::exchange(*static_cast<int*>(socket), takeDescriptor(descriptor));
        if (earlier >= 0) {
            ::close(earlier);
        }
    } catch (BusError const&) {
        return sd_bus_error_set(error, "org.bluez.Error.Rejected", "no descriptor left");
    }
    return sd_bus_reply_method_return(message, "");
}

int answerOnly(sd_bus_message* message, void*, sd_bus_error*)
{
    return sd_bus_reply_method_return(message, "");
}

// What the service calls: the object that a profile is registered with.
constexpr sd_bus_vtable profileObject[] = {
    SD_BUS_VTABLE_START(0),
    SD_BUS_METHOD("NewConnection", "oha{sv}", "", keepConnection, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_METHOD("RequestDisconnection", "o", "", answerOnly, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_METHOD("Release", "", "", answerOnly, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_VTABLE_END,
};

void registerProfile(SystemBus& bus)
{
    BusMessage const request = bus.makeCall(managerPath, profileManagerInterface, "RegisterProfile");
    checked(sd_bus_message_append(request.get(), "osa{sv}", objectPath, dialledService, 4, "Name", "s", "Velmora",
                                  "Role", "s", "client", "RequireAuthentication", "b", 0, "AutoConnect", "b", 0));
    bus.call(request);
}

void connectProfile(SystemBus& bus, std::string const& device)
{
    BusMessage const request = bus.makeCall(device, "org.bluez.Device1", "ConnectProfile");
    checked(sd_bus_message_append(request.get(), "s", dialledService));
    bus.call(request, dialConnectLimit);
}

// What has to stay while the socket is used: the service may take the connection back when the profile goes.
struct Registration
{
    explicit Registration(OpeningStop const& stop) : bus(stop) {}

    SystemBus bus;
    BusSlot object; // goes first
    int socket = -1;
};

int dial(Registration& profile, std::string const& device)
{
    sd_bus_slot* slot = nullptr;
    checked(sd_bus_add_object_vtable(profile.bus.raw(), &slot, objectPath, "org.bluez.Profile1", profileObject,
                                     &profile.socket));
    profile.object.reset(slot);
    registerProfile(profile.bus);
    connectProfile(profile.bus, device);
    profile.bus.waitUntil([&profile] { return profile.socket >= 0; }, std::chrono::seconds(2));
    return profile.socket;
}

} // namespace

std::optional<DialedSocket> dialByProfile(std::string const& mac, OpeningStop const& stop)
{
    try {
        auto const profile = std::make_shared<Registration>(stop);
        BluezObjects const objects = readBluezObjects(profile->bus);
        BluezDevice const* const device = objects.find(mac);
        if (device == nullptr || dial(*profile, device->path) < 0) {
            return std::nullopt;
        }
        profile->bus.forgetStop();
        return DialedSocket{profile->socket, profile};
    } catch (BusError const&) {
        return std::nullopt;
    } catch (Error const& error) {
        if (error.kind() == ErrorKind::Interrupted) {
            throw;
        }
        return std::nullopt;
    }
}

} // namespace velmora
