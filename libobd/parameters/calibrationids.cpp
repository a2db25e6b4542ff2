#include "libobd/parameters/calibrationids.h"

#include "libobd/parameters/bytetext.h"
#include "libobd/parameters/replychecks.h"
#include "libobd/parameters/saelines.h"

#include <common/logrecord.h>

#include <bitset>

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
    SaeLines const lines(data, guessChecksumLength(data));
    std::size_t const count = lines.count() / linesPerItem;
    if (count == 0) {
        return refuseLength(data);
    }
    if (!verifySaeSignature(data)) {
        return refuse("Invalid data received; signature mismatch");
    }
    if (lines.count() % linesPerItem != 0) {
        return readWholeItems(ecuId, lines) || refuseLength(data);
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

// Of a reply that lost a line, the items of which all lines came. One that did not, in front of one that did, keeps its
// place as an empty text: the verification numbers come in the same order.
bool CalibrationIds::readWholeItems(unsigned int ecuId, SaeLines const& lines)
{
    struct Item
    {
        std::vector<unsigned char> text = std::vector<unsigned char>(idLength);
        std::bitset<linesPerItem> came;
    };
    std::map<std::size_t, Item> items; // by their number, from 0
    std::vector<unsigned char> signature;
    getSignature(signature);
    for (std::size_t line = 0; line < lines.count(); ++line) {
        std::size_t const place = lines.place(line);
        if (lines.byte(line, 2) != 0 && lines.beginsWith(line, signature)) {
            Item& item = items[place / linesPerItem];
            lines.copyData(line, item.text, place % linesPerItem);
            item.came.set(place % linesPerItem);
        }
    }
    std::vector<std::string> texts;
    for (auto const& [number, item] : items) {
        if (item.came.all()) {
            texts.resize(number);
            texts.push_back(compactText(item.text));
        }
    }
    TERVEX_LOG(Info) << "Number of CalID items: " << texts.size() << ", of which some may have lost a line";
    std::vector<std::string>& ids = m_ids[ecuId];
    ids.insert(ids.end(), texts.begin(), texts.end());
    return !texts.empty();
}

} // namespace obd
