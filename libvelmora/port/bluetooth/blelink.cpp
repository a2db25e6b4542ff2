#include "libvelmora/port/bluetooth/blelink.h"

#include "libvelmora/port/bluetooth/bluetootherror.h"

#include <chrono>
#include <utility>

namespace velmora {

namespace {

using namespace std::chrono_literals;

constexpr char const* deviceInterface = "org.bluez.Device1";
constexpr char const* characteristicInterface = "org.bluez.GattCharacteristic1";
constexpr std::chrono::seconds bleSearchLimit{12};  // an inquiry takes 10.24 s
constexpr std::chrono::seconds bleConnectLimit{45}; // the kernel's own is up to 40 s
constexpr std::chrono::seconds resolveLimit{15};
constexpr std::chrono::milliseconds resolveStep{100};
constexpr int connectAttempts = 3;
constexpr std::size_t smallestUnit = 23; // the least that the standard has a device take at once
constexpr std::size_t unitHeader = 3;

// A device on the edge of reach is lost while it is connected to, and mostly found again.
bool isWorthAnotherTry(BusError const& error)
{
    return std::string_view(error.what()).find("abort-by-local") != std::string_view::npos;
}

void connectDevice(SystemBus& bus, BluezDevice const& device)
{
    for (int attempt = 1;; ++attempt) {
        try {
            bus.call(device.path, deviceInterface, "Connect", bleConnectLimit);
            return;
        } catch (BusError const& error) {
            if (error.name() == "org.bluez.Error.AlreadyConnected") {
                return;
            }
            if (attempt == connectAttempts || !isWorthAnotherTry(error)) {
                throw;
            }
        }
    }
}

// Before that, the characteristics are not known, or only those of the last visit.
BluezObjects awaitResolved(SystemBus& bus, std::string const& address)
{
    auto const end = std::chrono::steady_clock::now() + resolveLimit;
    while (std::chrono::steady_clock::now() < end) {
        BluezObjects objects = readBluezObjects(bus);
        BluezDevice const* const device = objects.find(address);
        if (device != nullptr && device->servicesResolved) {
            return objects;
        }
        bus.waitUntil([] { return false; }, resolveStep);
    }
    throw BusError("org.bluez.Error.TimedOut", "its services were not told in time: timeout");
}

std::vector<GattCharacteristic> below(BluezObjects const& objects, std::string const& device)
{
    std::vector<GattCharacteristic> own;
    for (GattCharacteristic const& each : objects.characteristics) {
        if (each.path.starts_with(device + "/")) {
            own.push_back(each);
        }
    }
    return own;
}

// A socket for the characteristic, and how much a datagram may hold; -1 where the service has none to give, or another
// program uses it.
std::pair<int, std::size_t> acquire(SystemBus& bus, std::string const& path, char const* method)
{
    BusMessage const request = bus.makeCall(path, characteristicInterface, method);
    checked(sd_bus_message_append(request.get(), "a{sv}", 0));
    try {
        BusMessage const answer = bus.call(request);
        int descriptor = -1;
        std::uint16_t unit = 0;
        checked(sd_bus_message_read(answer.get(), "hq", &descriptor, &unit));
        return {takeDescriptor(descriptor), unit};
    } catch (BusError const& error) {
        bool const otherWay =
            error.name() == "org.bluez.Error.NotSupported" || error.name() == "org.bluez.Error.NotPermitted" ||
            error.name() == "org.bluez.Error.InProgress" || error.name() == "org.freedesktop.DBus.Error.UnknownMethod";
        if (!otherWay) {
            throw;
        }
        return {-1, smallestUnit};
    }
}

void attach(BleLink& link)
{
    std::size_t unit = smallestUnit;
    std::tie(link.notifySocket, unit) = acquire(*link.bus, link.characteristics.notify.path, "AcquireNotify");
    if (link.characteristics.writesWithoutResponse()) {
        std::tie(link.writeSocket, unit) = acquire(*link.bus, link.characteristics.write.path, "AcquireWrite");
    }
    link.piece = std::max(unit, smallestUnit) - unitHeader;
}

} // namespace

BleLink connectBle(BleAddress const& address, OpeningStop const& stop)
{
    try {
        BleLink link;
        link.bus = std::make_unique<SystemBus>(stop);
        BluezDevice const device = findBluezDevice(*link.bus, address.mac, bleSearchLimit);
        link.device = device.path;
        link.wasConnected = device.connected;
        connectDevice(*link.bus, device);
        std::optional<SerialLink> const serial =
            chooseSerialLink(below(awaitResolved(*link.bus, address.mac), device.path));
        if (!serial) {
            throw Error(ErrorKind::PortFailed, "The Bluetooth device " + address.mac + " has no serial service",
                        {"is it the adapter? `velmora ports` lists them by name",
                         "an adapter of both kinds has another address for classic Bluetooth: bt://MAC"});
        }
        link.characteristics = *serial;
        attach(link);
        link.bus->forgetStop();
        return link;
    } catch (BusError const& error) {
        throw bluezError("Could not connect to " + address.mac + " by Bluetooth Low Energy", error.name(),
                         error.what());
    }
}

} // namespace velmora
