#include "libvelmora/port/bluetooth/pairing.h"

#include "libvelmora/port/bluetooth/bluetootherror.h"
#include "libvelmora/port/bluetooth/bluez.h"

#include <array>
#include <chrono>

namespace velmora {

namespace {

constexpr char const* agentPath = "/velmora/agent";
constexpr char const* agentManagerInterface = "org.bluez.AgentManager1";
constexpr std::chrono::seconds pairingSearchLimit{12};
constexpr std::chrono::seconds pairLimit{60};
constexpr std::array<char const*, 2> usualPins{"1234", "0000"};

// What the agent answers with.
struct Agent
{
    char const* pin = usualPins.front();
};

int tellPin(sd_bus_message* message, void* agent, sd_bus_error*)
{
    return sd_bus_reply_method_return(message, "s", static_cast<Agent*>(agent)->pin);
}

int tellPasskey(sd_bus_message* message, void* agent, sd_bus_error*)
{
    return sd_bus_reply_method_return(message, "u",
                                      static_cast<std::uint32_t>(std::stoul(static_cast<Agent*>(agent)->pin)));
}

int accept(sd_bus_message* message, void*, sd_bus_error*)
{
    return sd_bus_reply_method_return(message, "");
}

constexpr sd_bus_vtable agentObject[] = {
    SD_BUS_VTABLE_START(0),
    SD_BUS_METHOD("Release", "", "", accept, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_METHOD("RequestPinCode", "o", "s", tellPin, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_METHOD("DisplayPinCode", "os", "", accept, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_METHOD("RequestPasskey", "o", "u", tellPasskey, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_METHOD("DisplayPasskey", "ouq", "", accept, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_METHOD("RequestConfirmation", "ou", "", accept, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_METHOD("RequestAuthorization", "o", "", accept, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_METHOD("AuthorizeService", "os", "", accept, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_METHOD("Cancel", "", "", accept, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_VTABLE_END,
};

// An agent of the same bus connection is the one that the service asks, so it need not become the default one.
void registerAgent(SystemBus& bus)
{
    BusMessage const request = bus.makeCall("/org/bluez", agentManagerInterface, "RegisterAgent");
    checked(sd_bus_message_append(request.get(), "os", agentPath, "KeyboardDisplay"));
    bus.call(request);
}

void trust(SystemBus& bus, std::string const& device)
{
    BusMessage const request = bus.makeCall(device, "org.freedesktop.DBus.Properties", "Set");
    checked(sd_bus_message_append(request.get(), "ssv", "org.bluez.Device1", "Trusted", "b", 1));
    bus.call(request);
}

// Whether the device took the PIN; any other failure is thrown.
bool tryPair(SystemBus& bus, std::string const& device)
{
    try {
        bus.call(device, "org.bluez.Device1", "Pair", pairLimit);
        return true;
    } catch (BusError const& error) {
        if (error.name() == "org.bluez.Error.AlreadyExists") {
            return true;
        }
        if (error.name() != "org.bluez.Error.AuthenticationFailed") {
            throw;
        }
        return false;
    }
}

} // namespace

void pairDevice(std::string const& mac, std::function<void(std::string const& line)> const& tell,
                OpeningStop const& stop)
{
    try {
        SystemBus bus(stop);
        tell("Looking for " + mac + " ...\n");
        BluezDevice const device = findBluezDevice(bus, mac, pairingSearchLimit);
        Agent agent;
        sd_bus_slot* slot = nullptr;
        checked(sd_bus_add_object_vtable(bus.raw(), &slot, agentPath, "org.bluez.Agent1", agentObject, &agent));
        BusSlot const object(slot);
        registerAgent(bus);
        for (char const* const pin : usualPins) {
            agent.pin = pin;
            tell("Pairing with " + device.name + "; if it asks for a PIN, it is told " + pin + " ...\n");
            if (tryPair(bus, device.path)) {
                trust(bus, device.path);
                return;
            }
        }
        throw Error(ErrorKind::PortFailed, "The adapter " + mac + " refused the usual PINs, 1234 and 0000",
                    {"another PIN may be printed on it: pair it with bluetoothctl",
                     "adapters with a button want it pressed first"});
    } catch (BusError const& error) {
        throw bluezError("Could not pair with " + mac, error.name(), error.what());
    }
}

} // namespace velmora
