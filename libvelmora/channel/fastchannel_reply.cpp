// What becomes of a reply: handed on, asked for once more, remembered.

#include "libvelmora/channel/fastchannel.h"

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

// The adapter's word for it that a request brought nothing; empty for a vehicle that did not answer.
std::string troubleOf(HealedReply const& reply)
{
    if (reply.data || reply.error == "NODATA") {
        return {};
    }
    auto const word = std::ranges::find_if(
        reply.lines, [](std::string const& line) { return classifyLine(line).kind == LineKind::Error; });
    return word != reply.lines.end() ? *word : std::string();
}

} // namespace

// The prompt has come. Either the reply is handed on, or the request goes out once more and stays pending.
void FastChannel::finish(std::string const& raw)
{
    WireTime const took = m_wire->now() - m_pending->sentAt;
    HealedReply const reply = m_healer.heal(withoutOwnStop(raw), context());
    bool const stands = takeCut(reply);
    if (reply.silent && m_state.setting("ATR") != "ATR0") {
        note(Habit::EmptyReply); // the prompt of something before; the reply is still to come
        return;
    }
    m_silent = false;
    if (tellsLostSettings(reply)) {
        bool const again = setUpAgain(reply);
        if (again || m_lost) {
            return;
        }
    } else if (m_pending->count) {
        if (!takeCounted(reply, took)) {
            writePending(m_pending->command.text());
            return;
        }
    } else if (fallsBackToSearch(reply)) {
        return;
    } else if (!stands || shouldAskAgain(reply)) {
        note(Habit::AskedAgain);
        m_pending->askedAgain = true;
        writePending(m_pending->command.text());
        return;
    } else if (needsFullWait(reply)) {
        giveWaitBack();
        m_verified.insert(m_pending->key);
        m_pending->verifying = true;
        writePending(m_pending->command.text());
        return;
    } else if (reply.whole() && !m_pending->woken && m_pending->command.hasFixedShape() && m_state.headersOn()) {
        m_learner.learn(m_pending->key, reply.frames, took, m_wire->now());
    }
    observe(reply);
    if (m_pending->addressed) {
        tellReply(reply);
    }
    deliver(reply.text());
}

// An adapter that was still at work, or the first request of a vehicle that has to be woken, may do better at once. So
// may a reply of which nothing was left.
bool FastChannel::shouldAskAgain(HealedReply const& reply) const
{
    ElmCommand const& command = m_pending->command;
    if (m_pending->askedAgain || (command.isRequest() && !command.onlyReads())) {
        return false;
    }
    if (reply.error == "STOPPED" || (command.text() == "ATI" && reply.refused)) {
        return true;
    }
    bool const nothingLeft = command.isRequest() && reply.lines.empty();
    bool const onlyNotices = command.isRequest() && reply.notices && !reply.data && reply.error.empty();
    bool const firstAndSilent = command.isRequest() && !m_busSpoke && reply.error == "NODATA" && m_protocolsChosen == 1;
    return nothingLeft || onlyNotices || firstAndSilent || reply.doubtful;
}

void FastChannel::observe(HealedReply const& reply)
{
    ElmCommand const& command = m_pending->command;
    bool const wasEchoing = !m_state.echoOff();
    bool const hadHeaders = m_state.headersOn();
    m_state.observe(command, reply.text());
    if (command.isRequest()) {
        m_busSpoke = m_busSpoke || reply.data;
        m_trouble = troubleOf(reply);
        m_memory.remember(command, reply);
        learnVehicle(reply);
        if (!m_staying) {
            adaptWait(reply);
        }
        return;
    }
    if (!wasEchoing && m_state.echoOff() && !m_echoChecked) {
        m_echoChecked = true;
        m_echoStuck = reply.echoed;
    }
    if (command.text() == "ATI" && m_store != nullptr && !m_store->canCount(adapterKey())) {
        m_learner.switchOff();
    }
    if (command.setting() == "ATTP") {
        ++m_protocolsChosen;
    }
    if (command.setting() == "ATST") {
        m_waitSteps = 0; // the core's own wait is in force again
    }
    if (!hadHeaders && m_state.headersOn() && !m_connected) {
        m_memory.start();
        giveWaitBack(); // who is there is asked with all of the core's wait
    } else if (!command.onlyAsks()) {
        m_learner.clear(); // replies may be others from here on
        m_memory.stop();
    }
}

void FastChannel::deliver(std::string const& text)
{
    endExchange();
    m_ready.push_back(text);
}

void FastChannel::endExchange()
{
    Pending const done = std::move(*m_pending);
    m_pending.reset();
    if (done.verifying && m_waitBefore != 0) {
        setWait(m_waitBefore);
    }
    if (!m_staying) {
        restoreAddress();
    }
}

} // namespace velmora
