#include "libobd/parameters/saelines.h"

#include "libobd/bytes/bytes.h"

#include <common/logrecord.h>

namespace obd {

bool SaeLines::beginsWith(std::size_t line, std::vector<unsigned char> const& signature) const
{
    return startsWith(m_data, signature, line * m_step);
}

unsigned int SaeLines::place(std::size_t line) const
{
    return byte(line, 2) - 1U;
}

unsigned int SaeLines::word(std::size_t line, std::size_t index) const
{
    return readUint16(m_data, line * m_step + index);
}

std::vector<unsigned char> SaeLines::bytes(std::size_t line, std::size_t index, std::size_t count) const
{
    std::vector<unsigned char> part;
    for (std::size_t i = 0; i < count; ++i) {
        part.push_back(byte(line, index + i));
    }
    return part;
}

void SaeLines::copyData(std::size_t line, std::vector<unsigned char>& item, std::size_t toPlace) const
{
    for (std::size_t i = 0; i < dataLength; ++i) {
        item.at(toPlace * dataLength + i) = byte(line, 3 + i);
    }
}

bool assembleItem(SaeLines const& lines, std::size_t first, std::vector<unsigned char>& item)
{
    std::size_t const count = item.size() / SaeLines::dataLength;
    for (std::size_t line = first; line < first + count; ++line) {
        unsigned int const place = lines.place(line) - static_cast<unsigned int>(first);
        if (place >= count) {
            TERVEX_LOG(Error) << "Invalid data received; too large sequence number (" << place << ")";
            return false;
        }
        lines.copyData(line, item, place);
    }
    return true;
}

} // namespace obd
