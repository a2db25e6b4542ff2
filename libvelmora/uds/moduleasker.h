#pragma once

#include "libvelmora/channel/ichannelcontrol.h"
#include "libvelmora/signal/readingonly.h"
#include "libvelmora/uds/replyframes.h"

#include <obd/iobdproxy.h>

#include <optional>
#include <set>
#include <string>
#include <vector>

namespace velmora {

// What one request to one module brought.
struct ModuleAnswer
{
    enum class Kind
    {
        Positive,
        Refused,    // 7F, for this service
        Silent,     // nothing came
        Foreign,    // answers came, but none to this request
        Unreadable, // frames were lost
        BusTrouble, // the adapter's word is in detail
        NotReached, // the adapter does not know a command of the set-up, which is in detail
        NotSent,    // it may not be sent; the reason is in detail
    };

    Kind kind = Kind::Silent;
    unsigned int module = 0;            // id of the reply
    std::vector<unsigned char> payload; // from the service on; of Positive
    unsigned char code = 0;             // of Refused
    std::string detail;
};

// "does not answer", "refuses it: Request Out of Range", and so on; empty for Positive.
std::string describe(ModuleAnswer const& answer);

// The answer among messages: positive with service and identifier of the request in it, else a refusal of this service.
// Whatever else came is of another dialogue.
ModuleAnswer judgeReply(std::vector<unsigned char> const& request, ReplyContent const& content);

// Asks modules beyond OBD, one request at a time. What does not only read it does not send, whoever asks. For one
// thread; it may not have addressed a module of its own.
class ModuleAsker
{
public:
    // Both must outlive it.
    ModuleAsker(obd::IObdProxy& proxy, IChannelControl& control) : m_proxy(proxy), m_control(control) {}

    ModuleAnswer ask(RequestAddress const& address, std::vector<unsigned char> const& request,
                     RequestPurpose purpose = RequestPurpose::Signal);
    // The lines that the adapter shows of the bus for some seconds, of identifiers that fit the pattern; sends nothing.
    std::vector<std::string> listen(RequestAddress const& pattern, unsigned int milliseconds);

    obd::IObdProxy& proxy() const { return m_proxy; }

private:
    ReplyContent exchange(RequestAddress const& address, std::vector<unsigned char> const& request,
                          ModuleAnswer& trouble);

    obd::IObdProxy& m_proxy;
    IChannelControl& m_control;
    std::set<std::string> m_patient; // modules that asked for time and then were not waited for
    std::set<std::string> m_ownTester;
};

} // namespace velmora
