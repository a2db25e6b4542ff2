#include "libvelmora/uds/vehiclevin.h"

#include <algorithm>
#include <vector>

namespace velmora {

namespace {

constexpr unsigned int vinLimitMs = 3000;

} // namespace

std::string vehicleVin(obd::IObdProxy& proxy)
{
    constexpr std::size_t vinLength = 17;
    constexpr std::size_t lead = 3; // 49, 02, and the count of items
    obd::ResponseMap replies;
    proxy.execute(std::vector<unsigned char>{0x09, 0x02}, replies, vinLimitMs);
    for (auto const& [module, bytes] : replies) {
        if (bytes.size() >= lead + vinLength && bytes[0] == 0x49 && bytes[1] == 0x02) {
            std::string const vin(bytes.end() - static_cast<std::ptrdiff_t>(vinLength), bytes.end());
            if (std::all_of(vin.begin(), vin.end(), [](char each) { return each > ' ' && each < 0x7F; })) {
                return vin;
            }
        }
    }
    return {};
}

} // namespace velmora
