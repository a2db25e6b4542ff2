#include "libvelmora/read/servicereplies.h"

#include "libvelmora/read/topicanswer.h"

#include <obd/nack.h>

#include <utility>

namespace velmora {

ServiceReplies::ServiceReplies(obd::IObdProxy& proxy, unsigned char service, unsigned int timeoutMs)
    : m_service(service)
{
    obd::AdapterNote note{};
    auto const status = proxy.executeNoted(std::vector<unsigned char>{service}, m_responses, timeoutMs, note);
    if (status == obd::IDevice::Status::Unparsed || note != obd::AdapterNote::None) {
        m_others = ServiceReply::Kind::Unreadable;
    }
}

ServiceReplies::ServiceReplies(unsigned char service, obd::ResponseMap responses)
    : m_service(service), m_responses(std::move(responses))
{}

ServiceReply ServiceReplies::of(unsigned int ecu) const
{
    auto const found = m_responses.find(ecu);
    if (found == m_responses.end() || found->second.empty()) {
        return {m_others, {}, {}};
    }
    std::vector<unsigned char> const& bytes = found->second;
    if (bytes[0] == obd::positiveReply(m_service)) {
        return {ServiceReply::Kind::Positive, bytes, {}};
    }
    if (bytes[0] == obd::negativeReply && bytes.size() >= 3 && bytes[1] == m_service) {
        return {ServiceReply::Kind::Refused, bytes, refusalText(bytes[2])};
    }
    return {ServiceReply::Kind::Unreadable, bytes, {}};
}

std::vector<unsigned int> ServiceReplies::answering() const
{
    std::vector<unsigned int> ids;
    for (auto const& response : m_responses) {
        ids.push_back(response.first);
    }
    return ids;
}

} // namespace velmora
