#pragma once

#include <obd/iobdproxy.h>
#include <obd/responsemap.h>

#include <string>
#include <vector>

namespace velmora {

// What one control module said to a request.
struct ServiceReply
{
    enum class Kind : int
    {
        Positive,
        Refused, // a negative reply
        Silent,
        Unreadable, // a reply to something else, or one that came damaged
    };

    Kind kind = Kind::Silent;
    std::vector<unsigned char> bytes; // from the service byte on
    std::string reason;               // of a refusal, such as "conditions not correct (22)"
};

// Asks a service that takes no parameters, once, of all control modules, where one request changes all of them: the
// services of the library tell of the current module alone. Blocks.
class ServiceReplies
{
public:
    ServiceReplies(obd::IObdProxy& proxy, unsigned char service, unsigned int timeoutMs);
    // From replies at hand.
    ServiceReplies(unsigned char service, obd::ResponseMap responses);

    ServiceReply of(unsigned int ecu) const;
    std::vector<unsigned int> answering() const;

private:
    unsigned char m_service;
    obd::ResponseMap m_responses;
    ServiceReply::Kind m_others = ServiceReply::Kind::Silent; // of those that no reply could be read of
};

} // namespace velmora
