#include "libvelmora/vehicle/vehiclekey.h"

#include <fmt/format.h>

#include <cstdint>

namespace velmora {

std::string vehicleKey(std::string const& vin)
{
    std::uint64_t hash = 0xCBF29CE484222325;
    for (char const each : vin) {
        hash = (hash ^ static_cast<unsigned char>(each)) * 0x100000001B3;
    }
    return fmt::format("vehicle-{:016x}", hash);
}

} // namespace velmora
