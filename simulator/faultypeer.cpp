#include "simulator/faultypeer.h"

#include <algorithm>

namespace obdsim {

namespace {

constexpr char prompt = '>';
constexpr Time errorTime = Ms(20);

} // namespace

FaultyPeer::FaultyPeer(std::shared_ptr<IPeer> inner, FaultPlan plan)
    : m_inner(std::move(inner)), m_plan(std::move(plan)), m_random(m_plan.seed)
{}

/// Without faults nothing is counted, and the places of the first one count from zero.
void FaultyPeer::add(Fault fault)
{
    bool const byCommand = fault.kind == FaultKind::Prompt || fault.kind == FaultKind::Error ||
                           fault.kind == FaultKind::Silent || fault.kind == FaultKind::Reset;
    fault.position += fault.position == 0 ? 0 : byCommand ? m_command : m_byte;
    m_plan.faults.push_back(std::move(fault));
}

void FaultyPeer::clear()
{
    m_plan.faults.clear();
    m_silent = false;
}

void FaultyPeer::breakLink()
{
    m_linkUp = false;
}

void FaultyPeer::receive(std::string_view bytes)
{
    if (m_plan.faults.empty() && m_linkUp) {
        m_inner->receive(bytes);
        return;
    }
    for (char const byte : bytes) {
        if (!m_linkUp) {
            return;
        }
        if (byte == '\r' && ends(m_command + 1)) {
            ++m_command;
            continue;
        }
        if (m_silent) {
            continue;
        }
        m_inner->receive(std::string_view(&byte, 1));
        if (byte == '\r') {
            startCommand();
        }
    }
}

/// Whether the command does not come to its end: the adapter starts anew, or is silent for good.
bool FaultyPeer::ends(std::uint64_t command)
{
    for (auto const& fault : m_plan.faults) {
        if (fault.position != command) {
            continue;
        }
        if (fault.kind == FaultKind::Silent) {
            pull(now());
            m_silent = true;
        } else if (fault.kind == FaultKind::Reset) {
            restart(fault.word);
            return true;
        }
    }
    return m_silent;
}

void FaultyPeer::restart(std::string const& word)
{
    pull(now());
    m_inner->connect();
    m_inner->receive("ATZ\r");
    m_promptLost = false;
    m_dropping = word != "banner";
    if (!word.empty() && m_dropping) {
        m_output.push(now() + errorTime, word + "\r\r>");
    }
}

void FaultyPeer::startCommand()
{
    ++m_command;
    m_dropping = false;
    m_promptLost = false;
    for (auto const& fault : m_plan.faults) {
        if (fault.kind == FaultKind::Prompt && happens(fault, m_command)) {
            m_promptLost = true;
        }
        if (fault.kind == FaultKind::Error && happens(fault, m_command)) {
            pull(now()); // the echo, which has been said before
            m_dropping = true;
            m_output.push(now() + errorTime, fault.word + "\r\r>");
        }
    }
}

std::optional<Time> FaultyPeer::nextOutput() const
{
    auto const inner = m_linkUp ? m_inner->nextOutput() : std::nullopt;
    auto const own = m_output.next();
    if (!inner || !own) {
        return inner ? inner : own;
    }
    return std::min(*inner, *own);
}

std::string FaultyPeer::advanceTo(Time time)
{
    if (m_plan.faults.empty() && m_linkUp && !m_output.next()) {
        return m_inner->advanceTo(time);
    }
    pull(time);
    m_inner->advanceTo(time);
    return m_output.take(now());
}

Time FaultyPeer::now() const
{
    return m_inner->now();
}

void FaultyPeer::connect()
{
    m_inner->connect();
    m_output.clear();
    m_byte = 0;
    m_command = 0;
    m_dropping = false;
    m_promptLost = false;
    m_silent = false;
    m_linkUp = true;
}

bool FaultyPeer::linkIsUp() const
{
    return m_linkUp && m_inner->linkIsUp();
}

/// Takes what the inner peer puts out up to `time`, piece by piece.
void FaultyPeer::pull(Time time)
{
    for (auto next = m_inner->nextOutput(); next && *next <= time; next = m_inner->nextOutput()) {
        Time const due = *next;
        for (char const byte : m_inner->advanceTo(due)) {
            pass(byte, due);
        }
    }
}

void FaultyPeer::pass(char byte, Time time)
{
    if (m_dropping || m_silent || !m_linkUp) {
        m_dropping = m_dropping && byte != prompt;
        return;
    }
    addNoise(time);
    ++m_byte;
    for (auto const& fault : m_plan.faults) {
        if (fault.position != m_byte) {
            continue;
        }
        m_linkUp = m_linkUp && fault.kind != FaultKind::Loss;
        m_dropping = m_dropping || fault.kind == FaultKind::Cut;
        time += fault.kind == FaultKind::Stall ? fault.duration : Time(0);
    }
    if (m_dropping || !m_linkUp) {
        m_dropping = m_dropping && byte != prompt;
        return;
    }
    if (byte != prompt || !m_promptLost) {
        put(byte, time);
    }
}

void FaultyPeer::addNoise(Time time)
{
    for (auto const& fault : m_plan.faults) {
        if (fault.kind == FaultKind::Garbage && chance(fault.probability)) {
            put(static_cast<char>(1 + m_random() % 0xFF), time);
        }
        if (fault.kind == FaultKind::Nul && chance(fault.probability)) {
            put('\0', time);
        }
    }
}

bool FaultyPeer::happens(Fault const& fault, std::uint64_t position)
{
    return fault.position == 0 ? chance(fault.probability) : fault.position == position;
}

bool FaultyPeer::chance(double probability)
{
    return static_cast<double>(m_random()) < probability * 4294967296.0;
}

void FaultyPeer::put(char byte, Time time)
{
    Time delay{};
    for (auto const& fault : m_plan.faults) {
        delay += fault.kind == FaultKind::Slow ? fault.duration : Time(0);
    }
    m_output.push(time + delay, std::string(1, byte));
}

} // namespace obdsim
