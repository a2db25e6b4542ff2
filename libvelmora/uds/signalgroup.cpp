#include "libvelmora/uds/signalgroup.h"

#include "libvelmora/poll/pollwire.h"
#include "libvelmora/uds/combinedreply.h"
#include "libvelmora/uds/moduleaddress.h"

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

constexpr unsigned char readByIdentifier = 0x22;
constexpr unsigned int broadcastLimitMs = 1500;
constexpr std::size_t mostTogether = 3;         // identifiers that fit in a frame
constexpr std::size_t mostTogetherExtended = 2; // behind an address byte

unsigned int identifierOf(std::vector<unsigned char> const& request)
{
    return static_cast<unsigned int>(request[1]) << 8U | request[2];
}

} // namespace

SignalGroup::SignalGroup(std::shared_ptr<SignalBoard> board, std::shared_ptr<ModuleAsker> asker,
                         std::optional<RequestAddress> address)
    : m_board(std::move(board)), m_asker(std::move(asker)), m_address(std::move(address))
{}

void SignalGroup::add(ChosenSignal const& signal, unsigned int module)
{
    SignalEntry const& entry = m_board->set()[signal.index];
    auto same = std::find_if(m_requests.begin(), m_requests.end(),
                             [&](auto const& each) { return each->bytes == entry.signal.request; });
    if (same == m_requests.end()) {
        m_requests.push_back(std::make_unique<Request>());
        m_requests.back()->bytes = entry.signal.request;
        m_requests.back()->length = entry.signal.length;
        same = m_requests.end() - 1;
    }
    Request& request = **same;
    if (request.length != entry.signal.length) {
        request.length.reset();
    }
    request.members.push_back({signal, module});
}

std::vector<PollGuestWish> SignalGroup::wishes() const
{
    std::vector<PollGuestWish> wishes;
    auto const add = [&](ChosenSignal const& signal, unsigned int module) {
        if (signal.told) {
            wishes.push_back({module, signalId(signal.index), m_board->set()[signal.index].signal.id});
        }
    };
    for (auto const& request : m_requests) {
        for (Member const& member : request->members) {
            add(member.signal, member.module);
        }
    }
    for (ChosenSignal const& signal : m_workedOut) {
        add(signal, signal.module.value_or(0));
    }
    return wishes;
}

std::vector<ChosenSignal> SignalGroup::signalsOf(Request const& request) const
{
    std::vector<ChosenSignal> signals;
    for (Member const& member : request.members) {
        signals.push_back(member.signal);
    }
    return signals;
}

std::vector<PollResult> SignalGroup::turn(PollWire& wire)
{
    std::vector<PollResult> results;
    std::vector<Request*> due;
    for (auto const& request : m_requests) {
        if (request->state.isDue(wire.now())) {
            due.push_back(request.get());
        }
    }
    std::vector<Request*> const several = together(due);
    bool const asked = several.size() > 1 && askTogether(wire, several, results);
    for (Request* const request : due) {
        bool const done = asked && std::find(several.begin(), several.end(), request) != several.end();
        if (m_stop) {
            break;
        }
        if (!done) {
            askOne(wire, *request, results);
        }
    }
    for (ChosenSignal const& signal : m_workedOut) {
        if (std::optional<PollResult> const result = m_board->workOut(signal, wire.now())) {
            results.push_back(*result);
        }
    }
    return results;
}

// What may be asked for in one request: identifiers whose length is known, and was right when they were asked for
// alone. On a legacy bus a request has one identifier (ISO 14230-3).
std::vector<SignalGroup::Request*> SignalGroup::together(std::vector<Request*> const& due) const
{
    std::vector<Request*> chosen;
    std::size_t const most = m_address && !m_address->extended.empty() ? mostTogetherExtended : mostTogether;
    for (Request* const request : due) {
        bool const fits = m_address && !isLegacyHeader(m_address->header) && !m_severalFail &&
                          request->bytes.front() == readByIdentifier && request->provedLength &&
                          !request->state.wantsSplit();
        if (fits && chosen.size() < most) {
            chosen.push_back(request);
        }
    }
    return chosen;
}

// False if they are to be asked singly, from then on too.
bool SignalGroup::askTogether(PollWire& wire, std::vector<Request*> const& requests, std::vector<PollResult>& results)
{
    std::vector<unsigned char> bytes{readByIdentifier};
    std::map<unsigned int, std::size_t> lengths;
    for (Request const* const request : requests) {
        bytes.insert(bytes.end(), request->bytes.begin() + 1, request->bytes.end());
        lengths[identifierOf(request->bytes)] = *request->length;
    }
    ModuleAnswer answer = m_asker->ask(*m_address, bytes);
    auto const parts =
        answer.kind == ModuleAnswer::Kind::Positive ? divideReply(answer.payload, lengths) : std::nullopt;
    if (!parts || parts->size() != requests.size()) {
        m_severalFail = answer.kind != ModuleAnswer::Kind::Silent && answer.kind != ModuleAnswer::Kind::BusTrouble;
        return false;
    }
    for (Request* const request : requests) {
        answer.payload = parts->at(identifierOf(request->bytes));
        give(*request, answer, wire, results);
    }
    return true;
}

void SignalGroup::askOne(PollWire& wire, Request& request, std::vector<PollResult>& results)
{
    if (!m_address) {
        askBroadcast(wire, request, results);
        return;
    }
    give(request, m_asker->ask(*m_address, request.bytes), wire, results);
}

// Every module may answer, and some with what was asked before: service and identifier tell.
void SignalGroup::askBroadcast(PollWire& wire, Request& request, std::vector<PollResult>& results)
{
    if (std::optional<std::string> const refusal = refusalFor(request.bytes, RequestPurpose::Signal)) {
        give(request, {ModuleAnswer::Kind::NotSent, 0, {}, 0, *refusal}, wire, results);
        return;
    }
    obd::ResponseMap responses;
    wire.execute(request.bytes, responses, broadcastLimitMs);
    std::optional<ModuleAnswer> refused;
    bool told = false;
    for (auto const& [module, payload] : responses) {
        ReplyContent content;
        content.messages.push_back({module, payload});
        ModuleAnswer const answer = judgeReply(request.bytes, content);
        for (Member const& member : request.members) {
            bool const meant = member.module == 0 ? !told : member.module == module;
            if (meant && answer.kind == ModuleAnswer::Kind::Positive) {
                PollResult result = m_board->take(member.signal, member.module, module, payload, wire.now());
                if (member.signal.told) {
                    results.push_back(std::move(result));
                }
            }
        }
        told = told || answer.kind == ModuleAnswer::Kind::Positive;
        if (answer.kind == ModuleAnswer::Kind::Refused) {
            refused = answer;
        }
    }
    ModuleAnswer outcome;
    outcome.kind = told ? ModuleAnswer::Kind::Positive : outcome.kind;
    request.state.take(!told && refused ? *refused : outcome, wire.now());
    m_board->setReason(signalsOf(request), request.state.reason());
}

void SignalGroup::give(Request& request, ModuleAnswer const& answer, PollWire& wire, std::vector<PollResult>& results)
{
    request.state.take(answer, wire.now());
    m_board->setReason(signalsOf(request), request.state.reason());
    if (answer.kind == ModuleAnswer::Kind::Foreign || answer.kind == ModuleAnswer::Kind::Unreadable) {
        giveNothing(request, results);
    }
    if (answer.kind != ModuleAnswer::Kind::Positive) {
        return;
    }
    request.provedLength = request.length && answer.payload.size() == echoLength(request.bytes) + *request.length;
    for (Member const& member : request.members) {
        PollResult result = m_board->take(member.signal, member.module, answer.module, answer.payload, wire.now());
        if (member.signal.told) {
            results.push_back(std::move(result));
        }
    }
}

// What was answered by something else is shown as no value, rather than as the one of before.
void SignalGroup::giveNothing(Request const& request, std::vector<PollResult>& results)
{
    for (Member const& member : request.members) {
        PollResult result = m_board->takeNothing(member.signal, member.module);
        if (member.signal.told) {
            results.push_back(std::move(result));
        }
    }
}

} // namespace velmora
