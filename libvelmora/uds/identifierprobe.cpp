#include "libvelmora/uds/identifierprobe.h"

#include "libvelmora/signal/formulaparser.h"
#include "libvelmora/signal/signalhex.h"
#include "libvelmora/uds/identification.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/refusalcode.h"
#include "libvelmora/uds/standingguard.h"

#include <common/clock.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

constexpr unsigned char byIdentifier = 0x22;
constexpr std::uint32_t periodMs = 200; // five a second
constexpr unsigned int saveEvery = 16;
constexpr unsigned int firstOnes = 4; // that tell whether the module has the service at all
constexpr unsigned char serviceMissing = 0x11;
constexpr unsigned char wrongLength = 0x13;
constexpr char const* probeText = "the requests of a probe";

std::vector<unsigned char> requestFor(ProbeTask const& task, unsigned int id)
{
    std::vector<unsigned char> request{task.service};
    if (task.service == byIdentifier) {
        request.push_back(static_cast<unsigned char>(id >> 8U));
    }
    request.push_back(static_cast<unsigned char>(id & 0xFFU));
    return request;
}

bool isLocked(unsigned char code)
{
    RefusalAction const action = refusalAction(code);
    return action == RefusalAction::StopLocked || action == RefusalAction::StopSession;
}

bool isLater(unsigned char code)
{
    RefusalAction const action = refusalAction(code);
    return action == RefusalAction::RetryLater || action == RefusalAction::RetrySoon || action == RefusalAction::Wait;
}

} // namespace

void checkProbe(ProbeTask const& task)
{
    unsigned int const highest = task.service == byIdentifier ? 0xFFFF : 0xFF;
    bool const service = task.service == byIdentifier || task.service == 0x21 || task.service == 0x1A;
    if (!service) {
        std::optional<std::string> const refusal = refusalFor({task.service, 0x00}, RequestPurpose::Signal);
        throw Error(ErrorKind::WrongUse,
                    refusal ? *refusal : fmt::format("service {:02X} has no identifiers to probe", task.service),
                    {"services 22, 21 and 1A can be probed"});
    }
    if (task.from > task.to || task.to > highest) {
        throw Error(
            ErrorKind::WrongUse,
            fmt::format("{:X} to {:X} is no range of identifiers of service {:02X}", task.from, task.to, task.service),
            {fmt::format("they go from 0 to {:X}", highest)});
    }
}

std::string probeIdText(ProbeTask const& task, unsigned int id)
{
    return task.service == byIdentifier ? fmt::format("{:04X}", id) : fmt::format("{:02X}", id);
}

IdentifierProbe::IdentifierProbe(ModuleAsker& asker, std::function<void()> check,
                                 std::function<void(ProbeState const&)> save,
                                 std::function<void(ProbeState const&)> progress)
    : m_asker(asker), m_check(std::move(check)), m_save(std::move(save)), m_progress(std::move(progress))
{}

void IdentifierProbe::pace()
{
    std::uint32_t const now = tervex::currentMillis();
    if (m_last && now - *m_last < periodMs) {
        tervex::sleepMillis(periodMs - (now - *m_last));
    }
    m_last = tervex::currentMillis();
}

ModuleAnswer::Kind IdentifierProbe::ask(ProbeState& state, RequestAddress const& address, unsigned int id)
{
    pace();
    std::vector<unsigned char> const request = requestFor(state.task, id);
    ModuleAnswer const answer = m_asker.ask(address, request);
    if (answer.kind == ModuleAnswer::Kind::NotReached || answer.kind == ModuleAnswer::Kind::NotSent) {
        throw Error(ErrorKind::NotSupported, "The request " + hexText(request) + " " + describe(answer));
    }
    if (answer.kind == ModuleAnswer::Kind::Positive) {
        state.told[id] = {answer.payload.begin() + static_cast<std::ptrdiff_t>(request.size()), answer.payload.end()};
    } else if (answer.kind == ModuleAnswer::Kind::Refused && isLocked(answer.code)) {
        state.locked[id] = answer.code;
    } else if (answer.kind == ModuleAnswer::Kind::Refused && isLater(answer.code)) {
        state.later[id] = answer.code;
    }
    bool const missing =
        answer.kind == ModuleAnswer::Kind::Refused && (answer.code == serviceMissing || answer.code == wrongLength);
    if (missing && id < state.task.from + firstOnes && state.told.empty()) {
        throw Error(ErrorKind::NotSupported,
                    fmt::format("The module {} does not know service {:02X}: {}", state.task.header, state.task.service,
                                refusalName(answer.code)));
    }
    if (answer.kind == ModuleAnswer::Kind::Silent && id == state.task.from) {
        throw Error(ErrorKind::VehicleSilent, fmt::format("The module {} does not answer", state.task.header),
                    {"`velmora modules` looks for the modules that do"});
    }
    return answer.kind;
}

void IdentifierProbe::lookAgain(ProbeState& state, RequestAddress const& address, StandingGuard& guard)
{
    for (auto const& [id, data] : state.told) {
        if (state.second.contains(id)) {
            continue;
        }
        m_check();
        guard.check();
        pace();
        std::vector<unsigned char> const request = requestFor(state.task, id);
        ModuleAnswer const answer = m_asker.ask(address, request);
        if (answer.kind == ModuleAnswer::Kind::Positive) {
            state.second[id] = {answer.payload.begin() + static_cast<std::ptrdiff_t>(request.size()),
                                answer.payload.end()};
        }
        guard.countTrouble(answer.kind == ModuleAnswer::Kind::BusTrouble, probeText);
    }
}

void IdentifierProbe::run(ProbeState& state)
{
    checkProbe(state.task);
    AddressOrReason const reached =
        addressOf(state.task.header, state.task.reply, state.task.extended, m_asker.proxy().protocol());
    if (!reached.address) {
        throw Error(ErrorKind::WrongUse, "The module can't be asked: " + reached.reason);
    }
    StandingGuard guard(m_asker.proxy(), m_check);
    state.next = std::max(state.next, state.task.from);
    try {
        for (; state.next <= state.task.to; ++state.next) {
            m_check();
            guard.check();
            guard.countTrouble(ask(state, *reached.address, state.next) == ModuleAnswer::Kind::BusTrouble, probeText);
            m_progress(state);
            if ((state.next - state.task.from) % saveEvery == saveEvery - 1) {
                ProbeState saved = state;
                ++saved.next;
                m_save(saved);
            }
        }
        lookAgain(state, *reached.address, guard);
    } catch (...) {
        m_save(state);
        throw;
    }
    state.done = true;
}

SignalFile toSignalFile(ProbeState const& state)
{
    constexpr std::size_t ofModel = 8; // characters of a VIN that do not number the vehicle
    SignalFile file;
    file.vin = state.vin.size() > ofModel ? state.vin.substr(0, ofModel) + "*" : std::string();
    for (auto const& [id, data] : state.told) {
        if (data.empty()) {
            continue;
        }
        Signal signal;
        std::string const text = probeIdText(state.task, id);
        signal.id = fmt::format("M{}_{:02X}_{}", state.task.header, state.task.service, text);
        signal.name = fmt::format("Module {}, identifier {}", state.task.header, text);
        signal.header = state.task.header;
        signal.reply = standardReply(state.task.header) == state.task.reply ? std::string() : state.task.reply;
        signal.extendedAddress = state.task.extended;
        signal.request = requestFor(state.task, id);
        signal.reason = "found by a probe; what it means is not known";
        std::string const shown = state.task.service == byIdentifier ? identifierText(id, data) : hexText(data);
        bool const isText = data.size() > 4 && shown != hexText(data);
        if (isText) {
            signal.text = SignalText{0, 0};
            signal.name = fmt::format("Module {}, identifier {}: {}", state.task.header, text, shown);
        } else {
            constexpr char const* formulas[] = {"", "A", "int16(A, B)", "int24(A, B, C)", "int32(A, B, C, D)"};
            signal.formula = parseFormula(data.size() < 5 ? formulas[data.size()] : "A");
            signal.precision = 0;
        }
        file.signals.push_back(std::move(signal));
    }
    return file;
}

} // namespace velmora
