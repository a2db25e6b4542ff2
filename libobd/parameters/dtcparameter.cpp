#include "libobd/parameters/dtcparameter.h"

#include "libobd/bytes/bytes.h"
#include "libobd/catalogue/dtcreader.h"
#include "libobd/parameters/replychecks.h"

#include <common/logrecord.h>
#include <obd/protocolfamily.h>

namespace obd {

std::string dtcToString(std::vector<unsigned char> const& bytes)
{
    unsigned int const code = readUint16(bytes, 0);
    if ((code & 0x0FFFU) == 0) {
        return {};
    }
    // The top two bits choose the system; the first digit, 0 to 3, has the two below them.
    return "PCBU"[code >> 14U] + upperHex(code & 0x3FFFU, 4);
}

namespace {

constexpr std::size_t codeLength = 2;
constexpr std::size_t canHeaderLength = 2;                  // service, number of codes
constexpr std::size_t saeCodesLength = 3 * codeLength;      // of one line
constexpr std::size_t codesLineLength = 1 + saeCodesLength; // with the service, without a checksum

bool refuseShort(std::vector<unsigned char> const& data)
{
    TERVEX_LOG(Error) << "Invalid length: " << data.size();
    return false;
}

} // namespace

void DtcParameter::clear()
{
    m_codes.clear();
}

std::vector<std::shared_ptr<DtcDataModel>> DtcParameter::getTroubleCodes(IEcu const& ecu) const
{
    return findOrEmpty(m_codes, ecu);
}

bool DtcParameter::fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data)
{
    m_codes.erase(ecu->id());
    return isCan(ecu->protocol()) ? fromCanSystem(ecu->id(), data) : fromSaeSystem(ecu->id(), data);
}

bool DtcParameter::fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    if (data.size() < canHeaderLength) {
        return false;
    }
    std::size_t const codesLength = data[1] * codeLength;
    if (data.size() < canHeaderLength + codesLength) {
        return refuseShort(data);
    }
    parseCodes(ecuId, slice(data, canHeaderLength, codesLength)); // the frame's filling may follow
    return true;
}

bool DtcParameter::fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    if (data.size() < codesLineLength) {
        return refuseShort(data);
    }
    int const checksumLength = findSaeChecksumLength(data);
    if (checksumLength < 0) {
        return refuse("Invalid data received");
    }
    std::size_t const step = codesLineLength + static_cast<std::size_t>(checksumLength);
    for (std::size_t line = 0; line + step <= data.size(); line += step) {
        parseCodes(ecuId, slice(data, line + 1, saeCodesLength));
    }
    return true;
}

void DtcParameter::parseCodes(unsigned int ecuId, ByteView codes)
{
    for (std::size_t place = 0; place + codeLength <= codes.size(); place += codeLength) {
        std::string const code = dtcToString(toVector(slice(codes, place, codeLength)));
        if (!code.empty()) {
            auto const meanings = DtcReader().getTroubleCodes(code);
            auto& list = m_codes[ecuId];
            list.insert(list.end(), meanings.begin(), meanings.end());
        }
    }
}

} // namespace obd
