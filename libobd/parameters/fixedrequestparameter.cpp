#include "libobd/parameters/fixedrequestparameter.h"

#include "libobd/src/protocolfamily.h"

#include <utility>

namespace obd {
namespace {

constexpr unsigned char positiveReply = 0x40;

} // namespace

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
    signature.front() = static_cast<unsigned char>(signature.front() + positiveReply);
}

std::vector<unsigned char> requestFillers(ObdProtocol protocol)
{
    return std::vector<unsigned char>(isLegacy(protocol) ? 5U : 0U, 0x00);
}

} // namespace obd
