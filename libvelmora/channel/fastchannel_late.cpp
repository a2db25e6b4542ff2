// Replies that come when nobody waits for them any more.

#include "libvelmora/channel/fastchannel.h"

#include <algorithm>

namespace velmora {

namespace {

// The first question of who it is goes out again after 600 ms.
constexpr WireTime swallowedIdentity{700};

} // namespace

// Of the way to the adapter, or of one that takes long for everything.
WireTime FastChannel::latency() const
{
    return std::max(m_options.latency, m_late.lateness());
}

void FastChannel::noteLateness()
{
    ElmCommand const& command = m_pending->command;
    WireTime const took = m_wire->now() - m_pending->begunAt - m_options.latency;
    bool const swallowed = m_pending->woken && (command.text() != "ATI" || took < swallowedIdentity);
    if (!command.isRequest() && !command.monitors() && !command.resets() && !swallowed) {
        m_late.tookForCommand(took);
    }
}

// Nothing if it does not come in time, or once it is taken for lost.
std::optional<std::string> FastChannel::awaitLate(WireTime limit)
{
    while (isValid() && m_wire->now() < std::min(limit, remedyTime())) {
        std::string const bytes = listen(std::min(limit, remedyTime()));
        m_buffer += bytes;
        if (!bytes.empty()) {
            m_pending->heard = true;
            m_pending->heardAt = m_wire->now();
        }
        while (std::optional<std::string> const reply = cutReply()) {
            if (!compactText(*reply).empty() && !isOwed(*reply)) {
                return reply;
            }
        }
    }
    return std::nullopt;
}

// The host has given up on a reply. Its prompt is waited for; one behind whose data nothing more can come, or before
// which nothing came, is taken for lost, and the adapter is woken. Where that is in vain the link may stand still, so
// that the prompt is waited for on. Nothing of that reply is handed on.
void FastChannel::settle()
{
    bool const monitors = m_pending->command.monitors();
    WireTime limit{0};
    if (!m_silent && !monitors) {
        limit = m_wire->now() + LateAnswers::limit;
    } else if (m_silentFrom >= m_pending->begunAt && !monitors) {
        limit = m_pending->begunAt + LateAnswers::limit;
    }
    std::optional<std::string> late = awaitLate(limit);
    if (!late && isValid()) {
        std::string before;
        bool const awake = tryToWake(before);
        if (m_pending->addressed && monitors) {
            tellHeard(before);
        }
        if (!awake) {
            m_pending->woken = true;
            m_buffer.insert(0, before);
            late = awaitLate(limit);
        }
        if (!late) {
            note(Habit::LostPrompt);
        }
    }
    if (late) {
        note(Habit::LatePrompt);
        noteLateness();
        m_silent = false;
    }
    endExchange();
}

// Whether it answers an ATI that was not waited for any more, and so nothing that was asked since.
bool FastChannel::isOwed(std::string const& reply)
{
    std::string const text = compactText(reply);
    bool const echoed = text.starts_with("ATI");
    if (!m_late.owes(m_wire->now()) || text.empty() || text.substr(echoed ? 3 : 0) != m_state.identity()) {
        return false;
    }
    m_late.settledIdentity();
    note(Habit::StaleReply);
    return true;
}

} // namespace velmora
