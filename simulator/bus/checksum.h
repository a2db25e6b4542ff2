#pragma once

#include "simulator/bytes.h"

namespace obdsim {

/// The 8-bit sum that ends ISO 9141-2 and ISO 14230 messages.
std::uint8_t sumChecksum(Bytes const& message);

/// The SAE J1850 CRC: polynomial 0x1D, preset FF, inverted.
std::uint8_t j1850Crc(Bytes const& message);

} // namespace obdsim
