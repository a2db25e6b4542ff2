#include "libobd/parameters/calibrationids.h"

#include "libobd/parameters/bytetext.h"
#include "libobd/parameters/replychecks.h"
#include "libobd/parameters/saelines.h"

#include <common/logrecord.h>

namespace obd {
namespace {

constexpr std::size_t headerLength = 3; // service, info type, number of items
constexpr std::size_t itemLength = 16;
constexpr std::size_t linesPerItem = itemLength / SaeLines::dataLength;

} // namespace

void CalibrationIds::clear()
{
    m_ids.clear();
}

std::vector<std::string> CalibrationIds::calibrationIds(std::shared_ptr<IEcu> const& ecu) const
{
    return findOrEmpty(m_ids, *ecu);
}

bool CalibrationIds::fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    if (data.size() < headerLength + itemLength) {
        return refuseLength(data);
    }
    unsigned int const count = data[2];
    TERVEX_LOG(Info) << "Number of CALID items: " << count;
    for (std::size_t item = 0; item < count; ++item) {
        std::size_t const offset = headerLength + item * itemLength;
        if (offset + itemLength > data.size()) {
            return refuseLength(data);
        }
        m_ids[ecuId].push_back(compactText(slice(data, offset, itemLength)));
    }
    return true;
}

bool CalibrationIds::fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    SaeLines const lines(data, guessChecksumLength(data, linesPerItem));
    std::size_t const count = lines.count() / linesPerItem;
    if (count == 0) {
        return refuseLength(data);
    }
    if (!verifySaeSignature(data)) {
        return refuse("Invalid data received; signature mismatch");
    }
    TERVEX_LOG(Info) << "Number of CalID items: " << count;
    for (std::size_t item = 0; item < count; ++item) {
        std::vector<unsigned char> text(itemLength);
        if (!assembleItem(lines, item * linesPerItem, text)) {
            return false;
        }
        m_ids[ecuId].push_back(compactText(text));
    }
    return true;
}

} // namespace obd
