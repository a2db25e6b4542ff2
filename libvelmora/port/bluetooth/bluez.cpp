#include "libvelmora/port/bluetooth/bluez.h"

#include "libvelmora/port/bluetooth/bluetootherror.h"

#include <algorithm>
#include <cstdlib>
#include <map>
#include <string_view>
#include <variant>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds searchStep{500};

using Value = std::variant<std::monostate, bool, std::string, std::vector<std::string>>;
using Properties = std::map<std::string, Value>;

std::vector<std::string> readTexts(sd_bus_message* message)
{
    char** list = nullptr;
    checked(sd_bus_message_read_strv(message, &list));
    std::vector<std::string> texts;
    for (char** each = list; each != nullptr && *each != nullptr; ++each) {
        texts.emplace_back(*each);
        std::free(*each);
    }
    std::free(list);
    return texts;
}

// The few types that are of use here; every other value is skipped.
Value readValue(sd_bus_message* message)
{
    char const* type = nullptr;
    checked(sd_bus_message_peek_type(message, nullptr, &type));
    std::string const contents = type;
    if (contents == "b") {
        int value = 0;
        checked(sd_bus_message_read(message, "v", "b", &value));
        return value != 0;
    }
    if (contents == "s" || contents == "o") {
        char const* value = nullptr;
        checked(sd_bus_message_read(message, "v", type, &value));
        return std::string(value);
    }
    if (contents == "as") {
        checked(sd_bus_message_enter_container(message, 'v', "as"));
        std::vector<std::string> texts = readTexts(message);
        checked(sd_bus_message_exit_container(message));
        return texts;
    }
    checked(sd_bus_message_skip(message, "v"));
    return {};
}

Properties readProperties(sd_bus_message* message)
{
    Properties properties;
    checked(sd_bus_message_enter_container(message, 'a', "{sv}"));
    while (checked(sd_bus_message_enter_container(message, 'e', "sv")) > 0) {
        char const* key = nullptr;
        checked(sd_bus_message_read(message, "s", &key));
        properties.emplace(key, readValue(message));
        checked(sd_bus_message_exit_container(message));
    }
    checked(sd_bus_message_exit_container(message));
    return properties;
}

template <typename Type>
Type get(Properties const& properties, char const* key)
{
    auto const found = properties.find(key);
    auto const* const value = found != properties.end() ? std::get_if<Type>(&found->second) : nullptr;
    return value != nullptr ? *value : Type{};
}

BluezDevice toDevice(std::string const& path, Properties const& properties)
{
    return {path,
            get<std::string>(properties, "Address"),
            get<std::string>(properties, "Alias"),
            get<std::vector<std::string>>(properties, "UUIDs"),
            get<bool>(properties, "Paired"),
            get<bool>(properties, "Connected"),
            get<bool>(properties, "ServicesResolved"),
            properties.contains("RSSI")};
}

void take(BluezObjects& objects, std::string const& path, std::string_view interface, Properties const& properties)
{
    if (interface == "org.bluez.Adapter1") {
        objects.controllers.push_back({path, get<bool>(properties, "Powered")});
    } else if (interface == "org.bluez.Device1") {
        objects.devices.push_back(toDevice(path, properties));
    } else if (interface == "org.bluez.GattCharacteristic1") {
        objects.characteristics.push_back({path,
                                           get<std::string>(properties, "Service"),
                                           {},
                                           get<std::string>(properties, "UUID"),
                                           get<std::vector<std::string>>(properties, "Flags")});
    }
}

} // namespace

BluezDevice const* BluezObjects::find(std::string const& address) const
{
    auto const found = std::find_if(devices.begin(), devices.end(),
                                    [&address](BluezDevice const& each) { return each.address == address; });
    return found != devices.end() ? &*found : nullptr;
}

BluezController const* BluezObjects::poweredController() const
{
    auto const found =
        std::find_if(controllers.begin(), controllers.end(), [](BluezController const& each) { return each.powered; });
    return found != controllers.end() ? &*found : nullptr;
}

BluezObjects readBluezObjects(SystemBus& bus)
{
    BusMessage const answer = bus.call("/", "org.freedesktop.DBus.ObjectManager", "GetManagedObjects");
    sd_bus_message* const message = answer.get();
    BluezObjects objects;
    std::map<std::string, std::string> serviceUuids;
    checked(sd_bus_message_enter_container(message, 'a', "{oa{sa{sv}}}"));
    while (checked(sd_bus_message_enter_container(message, 'e', "oa{sa{sv}}")) > 0) {
        char const* path = nullptr;
        checked(sd_bus_message_read(message, "o", &path));
        checked(sd_bus_message_enter_container(message, 'a', "{sa{sv}}"));
        while (checked(sd_bus_message_enter_container(message, 'e', "sa{sv}")) > 0) {
            char const* interface = nullptr;
            checked(sd_bus_message_read(message, "s", &interface));
            Properties const properties = readProperties(message);
            take(objects, path, interface, properties);
            if (std::string_view(interface) == "org.bluez.GattService1") {
                serviceUuids.emplace(path, get<std::string>(properties, "UUID"));
            }
            checked(sd_bus_message_exit_container(message));
        }
        checked(sd_bus_message_exit_container(message));
        checked(sd_bus_message_exit_container(message));
    }
    for (GattCharacteristic& each : objects.characteristics) {
        each.serviceUuid = serviceUuids[each.service];
    }
    return objects;
}

BluezDiscovery::BluezDiscovery(SystemBus& bus, std::string const& controller) : m_bus(bus), m_controller(controller)
{
    BusMessage const filter = m_bus.makeCall(m_controller, "org.bluez.Adapter1", "SetDiscoveryFilter");
    checked(sd_bus_message_append(filter.get(), "a{sv}", 2, "Transport", "s", "auto", "DuplicateData", "b", 0));
    m_bus.call(filter);
    m_bus.call(m_controller, "org.bluez.Adapter1", "StartDiscovery");
}

BluezDiscovery::~BluezDiscovery()
{
    try {
        m_bus.call(m_controller, "org.bluez.Adapter1", "StopDiscovery");
    } catch (std::exception const&) {
        return; // it ends with the connection anyway
    }
}

BluezDevice findBluezDevice(SystemBus& bus, std::string const& address, std::chrono::seconds limit)
{
    BluezObjects objects = readBluezObjects(bus);
    if (BluezDevice const* const known = objects.find(address)) {
        return *known;
    }
    BluezController const* const controller = objects.poweredController();
    if (controller == nullptr) {
        throw BusError("org.bluez.Error.NotReady", objects.controllers.empty() ? "no controller" : "Not Powered");
    }
    BluezDiscovery const discovery(bus, controller->path);
    auto const end = std::chrono::steady_clock::now() + limit;
    while (std::chrono::steady_clock::now() < end) {
        bus.waitUntil([] { return false; }, searchStep);
        objects = readBluezObjects(bus);
        if (BluezDevice const* const found = objects.find(address)) {
            return *found;
        }
    }
    throw Error(ErrorKind::PortFailed, "No Bluetooth device " + address + " is in reach",
                {"is the ignition on, and is the adapter plugged in?", "is another phone or computer connected to it?",
                 "`velmora ports` lists Bluetooth adapters"});
}

} // namespace velmora
