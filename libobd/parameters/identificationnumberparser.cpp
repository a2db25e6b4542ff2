#include "libobd/parameters/identificationnumberparser.h"

#include "libobd/bytes/bytes.h"
#include "libobd/parameters/bytetext.h"
#include "libobd/parameters/replychecks.h"
#include "libobd/parameters/saelines.h"
#include "libobd/parameters/vehicleinformation.h"

#include <common/logrecord.h>

#include <utility>

namespace obd {

IdentificationNumberParser::IdentificationNumberParser(std::vector<unsigned char> signature, std::size_t length)
    : m_signature(std::move(signature)), m_length(length)
{}

bool IdentificationNumberParser::fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    if (data.size() < m_length) {
        return refuseLength(data);
    }
    if (!startsWith(data, m_signature, 0)) {
        return refuse("Invalid data received: signature mismatch");
    }
    TERVEX_LOG(Info) << "Number of items: " << static_cast<unsigned int>(data[2]);
    m_numbers[ecuId] = trimmedText(slice(data, infoHeaderLength, m_length - infoHeaderLength));
    return true;
}

bool IdentificationNumberParser::fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data,
                                               std::size_t checksumLength)
{
    SaeLines const lines(data, checksumLength);
    std::size_t const count = m_length / SaeLines::dataLength;
    if (lines.count() < count) {
        return refuseLength(data);
    }
    std::vector<unsigned char> number(m_length);
    for (std::size_t line = 0; line < count; ++line) {
        if (!lines.beginsWith(line, m_signature)) {
            return refuse("Invalid data received: signature mismatch");
        }
        unsigned int const place = lines.place(line);
        if (place >= count) {
            TERVEX_LOG(Error) << "Invalid sequence number: " << place;
            return false;
        }
        lines.copyData(line, number, place);
    }
    m_numbers[ecuId] = trimmedText(number);
    return true;
}

std::string IdentificationNumberParser::number(IEcu const& ecu) const
{
    return findOrEmpty(m_numbers, ecu);
}

} // namespace obd
