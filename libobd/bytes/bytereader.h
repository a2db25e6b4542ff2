#pragma once

#include <algorithm>
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

// Whether the bytes of prefix stand in data at the position.
inline bool startsWith(std::vector<unsigned char> const& data, std::vector<unsigned char> const& prefix,
                       std::size_t position)
{
    return data.size() >= position + prefix.size() &&
           std::equal(prefix.begin(), prefix.end(), data.begin() + static_cast<std::ptrdiff_t>(position));
}

} // namespace obd
