#pragma once

#include <cstddef>
#include <vector>

namespace obd {

// Big-endian fields of vehicle data. They throw std::out_of_range where a byte is missing: callers test the length
// first.
inline unsigned int readUint16(std::vector<unsigned char> const& data, std::size_t offset)
{
    return static_cast<unsigned int>(data.at(offset)) << 8U | data.at(offset + 1);
}

inline unsigned int readUint32(std::vector<unsigned char> const& data, std::size_t offset)
{
    return readUint16(data, offset) << 16U | readUint16(data, offset + 2);
}

} // namespace obd
