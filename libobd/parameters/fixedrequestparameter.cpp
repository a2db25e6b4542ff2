#include "libobd/parameters/fixedrequestparameter.h"

#include "libobd/parameters/replychecks.h"

#include <obd/nack.h>
#include <obd/protocolfamily.h>

#include <utility>

namespace obd {

FixedRequestParameter::FixedRequestParameter(std::vector<unsigned char> lead, std::vector<unsigned char> tail)
    : m_lead(std::move(lead)), m_tail(std::move(tail))
{}

void FixedRequestParameter::getRequestData(std::vector<unsigned char>& data) const
{
    data = m_lead;
    data.insert(data.end(), m_tail.begin(), m_tail.end());
}

void FixedRequestParameter::getSignature(std::vector<unsigned char>& signature) const
{
    signature = m_lead;
    signature.front() = positiveReply(signature.front());
}

std::optional<SaeLines> FixedRequestParameter::saeLines(std::vector<unsigned char> const& data) const
{
    if (data.size() < SaeLines::lineLength) {
        refuseLength(data);
        return std::nullopt;
    }
    int const checksumLength = findSaeChecksumLength(data);
    if (checksumLength < 0) {
        refuse("Invalid data received");
        return std::nullopt;
    }
    return SaeLines(data, static_cast<std::size_t>(checksumLength));
}

std::vector<unsigned char> requestFillers(ObdProtocol protocol)
{
    return std::vector<unsigned char>(isLegacy(protocol) ? 5U : 0U, 0x00);
}

} // namespace obd
