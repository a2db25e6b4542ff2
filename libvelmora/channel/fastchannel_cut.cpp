// Waits that the adapter does not shorten as it agreed to, ended by a character.

#include "libvelmora/channel/fastchannel.h"

#include <algorithm>

namespace velmora {

namespace {

constexpr std::string_view stopped = "STOPPED";

// The word for it stands behind all else.
std::string withoutStop(std::string const& raw)
{
    std::size_t const word = raw.rfind(stopped);
    bool const last = word != std::string::npos && compactText(raw.substr(word)) == stopped;
    return last ? raw.substr(0, word) : raw;
}

} // namespace

// Whether the request only tells if the vehicle is on the bus of the last visit.
bool FastChannel::triesBus() const
{
    return m_triedProtocol != 0 && !m_state.headersOn() && m_pending->command.asksForMask();
}

// Only where the wait of the channel's own is in force, so never before that and never on a K line; and for nothing
// that changes the vehicle.
bool FastChannel::mayCut() const
{
    Pending const& pending = *m_pending;
    bool const plain = pending.command.onlyReads() && !pending.count && !pending.addressed && !pending.woken &&
                       !pending.verifying && !pending.cutTried;
    bool const can = isCanBus(m_state.shownBus()) || triesBus(); // whose wait is recalled on CAN only
    return plain && m_cutter.pays() && m_waitSteps != 0 && !m_staying && can && pending.heard;
}

// When the wait that the adapter agreed to is over.
WireTime FastChannel::cutTime() const
{
    return m_pending && mayCut() ? m_pending->dataAt + waitTime(m_waitSteps) + m_cutter.doubt() : WireTime::max();
}

// Every module that was discovered must have spoken, each message whole: then the wait is for nobody who is known.
bool FastChannel::saysEnough() const
{
    bool const lineEnded = !m_buffer.empty() && (m_buffer.back() == '\r' || m_buffer.back() == '\n');
    HabitCounts uncounted{};
    HealedReply const reply = ReplyHealer(uncounted).heal(m_buffer, context());
    if (triesBus()) {
        return lineEnded && reply.data && reply.error.empty();
    }
    std::set<unsigned int> const& modules = m_memory.modules();
    bool const all =
        !modules.empty() && std::includes(reply.spoke.begin(), reply.spoke.end(), modules.begin(), modules.end());
    return all && lineEnded && reply.whole();
}

// A blank, since it means nothing to an adapter that has ended by itself meanwhile.
void FastChannel::cutWait()
{
    m_pending->cutTried = true;
    if (!saysEnough()) {
        return;
    }
    m_pending->cutAt = m_wire->now();
    ++m_working.waitsCut;
    m_wire->write(" ");
    tellSent(" ");
}

std::string FastChannel::withoutOwnStop(std::string const& raw) const
{
    return m_pending->cutAt ? withoutStop(raw) : raw;
}

// False if the request is to be asked once more, and left to end by itself.
bool FastChannel::takeCut(HealedReply const& reply)
{
    if (!m_pending->cutAt) {
        return true;
    }
    bool const whole = triesBus() ? reply.data && reply.error.empty() : reply.whole();
    m_cutter.cut(m_wire->now() - *m_pending->cutAt - m_options.latency, whole);
    return whole;
}

} // namespace velmora
