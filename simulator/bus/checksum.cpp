#include "simulator/bus/checksum.h"

#include <numeric>

namespace obdsim {

std::uint8_t sumChecksum(Bytes const& message)
{
    return static_cast<std::uint8_t>(std::accumulate(message.begin(), message.end(), 0U) & 0xFF);
}

std::uint8_t j1850Crc(Bytes const& message)
{
    constexpr unsigned int polynomial = 0x1D;
    unsigned int crc = 0xFF;
    for (auto const byte : message) {
        crc ^= byte;
        for (int bit = 0; bit < 8; ++bit) {
            crc = (crc & 0x80U) != 0 ? (crc << 1 ^ polynomial) : crc << 1;
        }
        crc &= 0xFF;
    }
    return static_cast<std::uint8_t>(crc ^ 0xFF);
}

} // namespace obdsim
