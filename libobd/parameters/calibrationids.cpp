#include "libobd/parameters/calibrationids.h"

#include "libobd/parameters/bytetext.h"
#include "libobd/parameters/replychecks.h"
#include "libobd/parameters/saelines.h"

#include <common/logrecord.h>

namespace obd {
namespace {

constexpr std::size_t idLength = 16;
constexpr std::size_t linesPerItem = idLength / SaeLines::dataLength;

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
    if (data.size() < infoHeaderLength + idLength) {
        return refuseLength(data);
    }
    unsigned int const count = data[2];
    TERVEX_LOG(Info) << "Number of CALID items: " << count;
    for (std::size_t item = 0; item < count; ++item) {
        std::size_t const offset = infoHeaderLength + item * idLength;
        if (offset + idLength > data.size()) {
            return refuseLength(data);
        }
        m_ids[ecuId].push_back(compactText(slice(data, offset, idLength)));
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
        std::vector<unsigned char> text(idLength);
        if (!assembleItem(lines, item * linesPerItem, text)) {
            return false;
        }
        m_ids[ecuId].push_back(compactText(text));
    }
    return true;
}

} // namespace obd
