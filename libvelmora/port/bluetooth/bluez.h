#pragma once

#include "libvelmora/port/bluetooth/gattchoice.h"
#include "libvelmora/port/bluetooth/systembus.h"

#include <optional>
#include <string>
#include <vector>

namespace velmora {

struct BluezController
{
    std::string path; // "/org/bluez/hci0"
    bool powered = false;
};

struct BluezDevice
{
    std::string path; // below its controller's
    std::string address;
    std::string name; // as the user knows it
    std::vector<std::string> services;
    bool paired = false;
    bool connected = false;
    bool servicesResolved = false; // the characteristics are known
    bool nearby = false;           // heard in the current search
};

// What the Bluetooth service knows: controllers, devices, and the characteristics of those that are connected.
struct BluezObjects
{
    std::vector<BluezController> controllers;
    std::vector<BluezDevice> devices;
    std::vector<GattCharacteristic> characteristics;

    BluezDevice const* find(std::string const& address) const;
    // Nothing unless a controller is switched on.
    BluezController const* poweredController() const;
};

// Throws BusError.
BluezObjects readBluezObjects(SystemBus& bus);

// Has the controllers listen for devices while it lives; the service ends the search with the bus connection at latest.
class BluezDiscovery
{
public:
    BluezDiscovery(SystemBus& bus, std::string const& controller);
    ~BluezDiscovery();
    BluezDiscovery(BluezDiscovery const&) = delete;
    BluezDiscovery& operator=(BluezDiscovery const&) = delete;

private:
    SystemBus& m_bus;
    std::string m_controller;
};

// The device of that address, looked for up to the limit if it is not known yet. Throws BusError, Error.
BluezDevice findBluezDevice(SystemBus& bus, std::string const& address, std::chrono::seconds limit);

} // namespace velmora
