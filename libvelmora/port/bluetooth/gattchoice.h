#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace velmora {

// A value of a Bluetooth Low Energy device that is read, written or told (GATT).
struct GattCharacteristic
{
    std::string path;
    std::string service; // the path of its service
    std::string serviceUuid;
    std::string uuid;
    std::vector<std::string> flags; // "notify", "write", "write-without-response", ...
};

// The pair of characteristics that carries an adapter's bytes.
struct SerialLink
{
    GattCharacteristic notify; // the adapter's
    GattCharacteristic write;  // ours

    bool writesWithoutResponse() const;
};

// The services that adapters are known to have come first; then any with one characteristic that tells and one that
// takes, but for those of the standard and of firmware updates. Which is which tell the flags alone: some adapters have
// the two the other way round.
std::optional<SerialLink> chooseSerialLink(std::vector<GattCharacteristic> const& characteristics);

// Whether adapters are known to offer such a service. Printers, lamps and scales offer the same.
bool isSerialService(std::string_view uuid);

} // namespace velmora
