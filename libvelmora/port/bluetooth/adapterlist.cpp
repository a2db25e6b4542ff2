#include "libvelmora/port/bluetooth/adapterlist.h"

#include "common/text/text.h"
#include "libvelmora/port/bluetooth/bluetootherror.h"
#include "libvelmora/port/bluetooth/bluez.h"

#include <algorithm>
#include <array>
#include <optional>
#include <string_view>

namespace velmora {

namespace {

constexpr std::string_view serialPortService = "00001101-0000-1000-8000-00805f9b34fb";

// Names that adapters are sold under, in upper case.
constexpr std::array<std::string_view, 11> adapterNames{
    "OBD", "V-LINK", "VLINK", "IOS-VLINK", "ANDROID-VLINK", "VEEPEAK", "VIECAR", "KONNWEI", "CAR2LS", "VGATE", "ICAR"};

bool isAdapterName(std::string const& name)
{
    std::string const upper = toUpper(name);
    return std::any_of(adapterNames.begin(), adapterNames.end(),
                       [&upper](std::string_view each) { return upper.find(each) != std::string::npos; });
}

// A device of both kinds is named by its classic one, which is the faster.
std::optional<BluetoothEntry> toEntry(BluezDevice const& device)
{
    auto const& services = device.services;
    bool const classic = std::find(services.begin(), services.end(), serialPortService) != services.end();
    bool const lowEnergy = std::any_of(services.begin(), services.end(), isSerialService);
    bool const named = isAdapterName(device.name);
    if (!classic && !lowEnergy && !named) {
        return std::nullopt;
    }
    return BluetoothEntry{(lowEnergy && !classic ? "ble://" : "bt://") + device.address, device.name, device.paired,
                          device.nearby, named};
}

BluezObjects search(SystemBus& bus, std::string const& controller, std::chrono::seconds limit)
{
    BluezDiscovery const discovery(bus, controller);
    bus.waitUntil([] { return false; }, limit);
    return readBluezObjects(bus);
}

} // namespace

std::vector<BluetoothEntry> listBluetoothAdapters(std::chrono::seconds limit, OpeningStop const& stop)
{
    try {
        SystemBus bus(stop);
        BluezObjects objects = readBluezObjects(bus);
        BluezController const* const controller = objects.poweredController();
        if (controller == nullptr) {
            throw BusError("org.bluez.Error.NotReady", "Not Powered");
        }
        if (limit.count() > 0) {
            objects = search(bus, controller->path, limit);
        }
        std::vector<BluetoothEntry> entries;
        for (BluezDevice const& device : objects.devices) {
            if (std::optional<BluetoothEntry> const entry = toEntry(device)) {
                entries.push_back(*entry);
            }
        }
        std::stable_sort(entries.begin(), entries.end(),
                         [](BluetoothEntry const& a, BluetoothEntry const& b) { return a.paired && !b.paired; });
        return entries;
    } catch (BusError const& error) {
        throw bluezError("Bluetooth adapters can't be listed", error.name(), error.what());
    }
}

} // namespace velmora
