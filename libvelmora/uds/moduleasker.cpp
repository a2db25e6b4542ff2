#include "libvelmora/uds/moduleasker.h"

#include "libvelmora/signal/signal.h"
#include "libvelmora/signal/signalhex.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/refusalcode.h"

#include <obd/nack.h>

#include <algorithm>

namespace velmora {

namespace {

constexpr unsigned int exchangeLimitMs = 6000;
constexpr unsigned int longestWaitMs = 1044; // ATST FF

std::string moduleKey(RequestAddress const& address)
{
    return address.header + "/" + address.extended;
}

// Of several identifiers in one request the module leaves those out that it has not.
bool isEchoed(std::vector<unsigned char> const& request, std::vector<unsigned char> const& payload)
{
    if (payload.empty() || payload.front() != obd::positiveReply(request.front())) {
        return false;
    }
    if (request.front() == 0x22 && request.size() != 3) {
        return payload.size() >= 3;
    }
    // Readers of codes repeat their sub-function only; those of KWP2000 a count instead.
    bool const uds = request.front() == 0x19 || request.front() == 0x3E;
    bool const bare = request.front() == 0x18 || request.front() == 0x13 || request.front() == 0x03 ||
                      request.front() == 0x07 || request.front() == 0x0A;
    std::size_t const echo = bare ? 1 : uds ? std::min<std::size_t>(request.size(), 2) : echoLength(request);
    return payload.size() >= echo &&
           std::equal(request.begin() + 1, request.begin() + static_cast<std::ptrdiff_t>(echo), payload.begin() + 1);
}

// On SAE J1850 the request's own bytes stand between its service and the code.
unsigned char refusalIn(std::vector<unsigned char> const& request, std::vector<unsigned char> const& payload)
{
    bool const repeats = request.size() > 1 && payload[2] == request[1];
    return repeats ? payload.back() : payload[2];
}

bool asksForTime(ModuleAnswer const& answer)
{
    return answer.kind == ModuleAnswer::Kind::Refused && answer.code == obd::NackResponsePending;
}

} // namespace

std::string describe(ModuleAnswer const& answer)
{
    switch (answer.kind) {
    case ModuleAnswer::Kind::Positive:
        return {};
    case ModuleAnswer::Kind::Refused:
        return asksForTime(answer) ? "asks for time and then does not answer"
                                   : "is refused: " + refusalName(answer.code);
    case ModuleAnswer::Kind::Silent:
        return "is not answered";
    case ModuleAnswer::Kind::Foreign:
        return "is answered by something else";
    case ModuleAnswer::Kind::Unreadable:
        return "is answered unreadably";
    case ModuleAnswer::Kind::BusTrouble:
        return "brings trouble on the bus: " + answer.detail;
    case ModuleAnswer::Kind::NotReached:
        return "can't be asked by this adapter, which does not know " + answer.detail;
    case ModuleAnswer::Kind::NotSent:
        return "is not asked: " + answer.detail;
    }
    return {};
}

ModuleAnswer judgeReply(std::vector<unsigned char> const& request, ReplyContent const& content)
{
    ModuleAnswer answer;
    for (ModuleReply const& each : content.messages) {
        if (isEchoed(request, each.payload)) {
            return {ModuleAnswer::Kind::Positive, each.id, each.payload, 0, {}};
        }
        bool const refusal =
            each.payload.size() > 2 && each.payload[0] == obd::negativeReply && each.payload[1] == request[0];
        // Behind a "response pending" may come another refusal, which is the answer.
        if (refusal && (answer.kind != ModuleAnswer::Kind::Refused || asksForTime(answer))) {
            answer = {ModuleAnswer::Kind::Refused, each.id, {}, refusalIn(request, each.payload), {}};
        }
    }
    if (answer.kind == ModuleAnswer::Kind::Refused) {
        return answer;
    }
    if (!content.error.empty() && content.error != "NODATA") {
        answer.kind = ModuleAnswer::Kind::BusTrouble;
        answer.detail = content.error;
    } else if (content.broken) {
        answer.kind = ModuleAnswer::Kind::Unreadable;
    } else if (!content.messages.empty()) {
        answer.kind = ModuleAnswer::Kind::Foreign;
    }
    return answer;
}

ReplyContent ModuleAsker::exchange(RequestAddress const& address, std::vector<unsigned char> const& request,
                                   ModuleAnswer& trouble)
{
    AddressedModule const scope(m_control, address);
    std::string ignored; // the channel tells more of what came than the library
    m_proxy.execute(hexText(request), ignored, exchangeLimitMs);
    AddressedReply const reply = m_control.takeReply();
    std::string const refused = m_control.refusedAddress();
    if (!refused.empty()) {
        trouble = {ModuleAnswer::Kind::NotReached, 0, {}, 0, refused};
    } else if (!reply.answered) {
        trouble = {ModuleAnswer::Kind::BusTrouble, 0, {}, 0, "the adapter does not answer"};
    }
    ReplyContent content = readReply(reply, busKindOf(m_proxy.protocol()));
    if (isLegacyHeader(address.header)) {
        // There the adapter hears whoever speaks to the tester.
        std::erase_if(content.messages,
                      [module = answeringModule(address)](ModuleReply const& each) { return each.id != module; });
    }
    return content;
}

ModuleAnswer ModuleAsker::ask(RequestAddress const& address, std::vector<unsigned char> const& request,
                              RequestPurpose purpose)
{
    if (std::optional<std::string> const refusal = refusalFor(request, purpose)) {
        return {ModuleAnswer::Kind::NotSent, 0, {}, 0, *refusal};
    }
    std::string const key = moduleKey(address);
    RequestAddress used = address;
    if (m_patient.contains(key)) {
        used.adaptive = false;
        used.waitMs = longestWaitMs;
    }
    if (m_ownTester.contains(key)) {
        used.tester = used.extended;
    }
    auto const judged = [&] {
        ModuleAnswer trouble;
        ReplyContent const content = exchange(used, request, trouble);
        return trouble.kind != ModuleAnswer::Kind::Silent ? trouble : judgeReply(request, content);
    };
    ModuleAnswer answer = judged();
    // Some modules put their own address in front of their frames, and the adapter drops what is not the tester's.
    if (answer.kind == ModuleAnswer::Kind::Silent && !used.extended.empty() && used.tester != used.extended &&
        request.front() != 0x3E) {
        used.tester = used.extended;
        answer = judged();
        if (answer.kind != ModuleAnswer::Kind::Silent) {
            m_ownTester.insert(key);
        }
    }
    // The adapter has ended the exchange while the module was still at it.
    if (asksForTime(answer) && m_patient.insert(key).second) {
        used.adaptive = false;
        used.waitMs = longestWaitMs;
        answer = judged();
    }
    return answer;
}

std::vector<std::string> ModuleAsker::listen(RequestAddress const& pattern, unsigned int milliseconds)
{
    AddressedModule const scope(m_control, pattern);
    std::string ignored;
    m_proxy.execute(std::string("ATMA"), ignored, milliseconds);
    // A command that only asks ends it, without giving the adapter back.
    m_proxy.execute(std::string("ATI"), ignored, exchangeLimitMs);
    return m_control.takeReply().lines;
}

} // namespace velmora
