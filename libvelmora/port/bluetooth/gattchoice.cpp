#include "libvelmora/port/bluetooth/gattchoice.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <map>

namespace velmora {

namespace {

constexpr std::string_view baseEnd = "-0000-1000-8000-00805f9b34fb"; // of the 16-bit identifiers

// In the order in which they are preferred where a device has several.
constexpr std::array<std::string_view, 7> serialServices{
    "fff0",                                 // most nameless adapters
    "ffe0",                                 // serial modules of the HM-10 kind
    "18f0",                                 // Vgate, vLinker
    "e7810a71-73ae-499d-8c15-faa9aef0c3f2", // a second one of the same
    "49535343-fe7d-4ae5-8fa9-9fafd205e455", // Microchip's transparent UART
    "6e400001-b5a3-f393-e0a9-e50e24dcca9e", // Nordic's UART
    "fee0",                                 // WiCAN
};

// Generic access, generic attribute, device information, battery; and a firmware update that takes and tells as well.
constexpr std::array<std::string_view, 5> notSerial{"1800", "1801", "180a", "180f", "fef5"};

// The 16 bits of a short identifier, all of a long one; lower case.
std::string shortened(std::string_view uuid)
{
    std::string text(uuid);
    std::transform(text.begin(), text.end(), text.begin(), [](unsigned char each) { return std::tolower(each); });
    bool const isShort = text.size() == 36 && text.starts_with("0000") && text.ends_with(baseEnd);
    return isShort ? text.substr(4, 4) : text;
}

bool has(GattCharacteristic const& characteristic, std::string_view flag)
{
    return std::find(characteristic.flags.begin(), characteristic.flags.end(), flag) != characteristic.flags.end();
}

bool tells(GattCharacteristic const& characteristic)
{
    return has(characteristic, "notify") || has(characteristic, "indicate");
}

bool takes(GattCharacteristic const& characteristic)
{
    return has(characteristic, "write") || has(characteristic, "write-without-response");
}

// One that does nothing else is preferred for each part: some do both, and a service may hold more of them.
template <typename Wanted, typename Other>
GattCharacteristic const* pick(std::vector<GattCharacteristic> const& service, Wanted wanted, Other other)
{
    auto found = std::find_if(service.begin(), service.end(),
                              [&](GattCharacteristic const& each) { return wanted(each) && !other(each); });
    if (found == service.end()) {
        found = std::find_if(service.begin(), service.end(), wanted);
    }
    return found != service.end() ? &*found : nullptr;
}

std::optional<SerialLink> linkOf(std::vector<GattCharacteristic> const& service)
{
    GattCharacteristic const* const notify = pick(service, tells, takes);
    GattCharacteristic const* const write = pick(service, takes, tells);
    return notify != nullptr && write != nullptr ? std::optional(SerialLink{*notify, *write}) : std::nullopt;
}

} // namespace

bool SerialLink::writesWithoutResponse() const
{
    return has(write, "write-without-response");
}

bool isSerialService(std::string_view uuid)
{
    return std::find(serialServices.begin(), serialServices.end(), shortened(uuid)) != serialServices.end();
}

std::optional<SerialLink> chooseSerialLink(std::vector<GattCharacteristic> const& characteristics)
{
    std::map<std::string, std::vector<GattCharacteristic>> services;
    for (GattCharacteristic const& each : characteristics) {
        services[each.service].push_back(each);
    }
    for (std::string_view const known : serialServices) {
        for (auto const& [path, service] : services) {
            if (shortened(service.front().serviceUuid) != known) {
                continue;
            }
            if (std::optional<SerialLink> link = linkOf(service)) {
                return link;
            }
        }
    }
    for (auto const& [path, service] : services) {
        std::string const uuid = shortened(service.front().serviceUuid);
        if (std::find(notSerial.begin(), notSerial.end(), uuid) != notSerial.end()) {
            continue;
        }
        if (std::optional<SerialLink> link = linkOf(service)) {
            return link;
        }
    }
    return std::nullopt;
}

} // namespace velmora
