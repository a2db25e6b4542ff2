#pragma once

#include <algorithm>
#include <cstddef>
#include <span>
#include <stdexcept>
#include <vector>

namespace obd {

// A stretch of bytes owned by someone else.
using ByteView = std::span<unsigned char const>;

// Bytes index..index+count of the view. Throws std::out_of_range if they are not all there.
inline ByteView slice(ByteView bytes, std::size_t index, std::size_t count)
{
    if (index > bytes.size() || count > bytes.size() - index) {
        throw std::out_of_range("bytes outside the message");
    }
    return bytes.subspan(index, count);
}

// The byte at index. Throws std::out_of_range if there is none.
inline unsigned char byteAt(ByteView bytes, std::size_t index)
{
    return slice(bytes, index, 1).front();
}

// Overwrites target from index on. Throws std::out_of_range, leaving target alone, if source does not fit in.
inline void copyInto(std::vector<unsigned char>& target, std::size_t index, ByteView source)
{
    if (index > target.size() || source.size() > target.size() - index) {
        throw std::out_of_range("copy past the end of the message");
    }
    std::copy(source.begin(), source.end(), target.begin() + static_cast<std::ptrdiff_t>(index));
}

} // namespace obd
