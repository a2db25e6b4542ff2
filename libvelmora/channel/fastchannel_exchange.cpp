// One exchange with the adapter, from the command to its prompt.

#include "libvelmora/channel/fastchannel.h"

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

// No reply of a vehicle comes near it.
constexpr std::size_t longestReply = 1U << 20U;

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

bool isBlank(std::string_view text)
{
    return compactText(text).empty();
}

} // namespace

void FastChannel::begin(std::string const& text)
{
    if (!std::exchange(m_begun, true)) {
        giveLeftOversBack();
    }
    Pending pending{.command = ElmCommand(text), .sent = {}, .key = {}, .module = {}, .count = {}};
    if (m_connected && m_memory.isOn()) {
        m_memory.stop();
    }
    if (m_connected && m_waitSteps != 0 && !m_waitsLong) {
        giveWaitBack();
        m_waitBefore = 0;
    }
    if (std::optional<std::string> const known = m_memory.recall(pending.command)) {
        ++m_working.fromMemory;
        m_ready.push_back(*known);
        return;
    }
    pending.key = pending.command.text();
    pending.asker = std::this_thread::get_id();
    pending.latency = m_options.latency;
    m_starting = pending.command.resets();
    bool const reachesBus = pending.command.isRequest() || pending.command.monitors();
    if (!reachesBus && !pending.command.onlyAsks()) {
        endStay();
    }
    if (reachesBus) {
        if (!setAddress(pending)) {
            m_ready.emplace_back("?\r");
            return;
        }
    }
    if (pending.command.isRequest()) {
        pending.count = countFor(pending);
    }
    m_pending = std::move(pending);
    if (triesProtocol(text)) {
        writePending("ATTP" + std::to_string(m_triedProtocol));
    } else {
        writePending(text + (m_pending->count ? std::to_string(*m_pending->count) : ""));
    }
}

void FastChannel::write(std::string const& text)
{
    drain();
    ++m_working.exchanges;
    m_wire->write(text + "\r");
    tellSent(text + "\r");
}

void FastChannel::writePending(std::string const& text)
{
    write(text);
    m_pending->sent = compactText(text);
    m_pending->sentAt = m_wire->now();
    m_pending->heardAt = m_pending->sentAt;
    m_pending->dataAt = m_pending->sentAt;
    m_pending->heard = false;
}

// What was said since the last prompt is no answer to what comes now.
void FastChannel::drain()
{
    m_buffer += m_wire->read(m_wire->now());
    while (std::optional<std::string> const stale = cutReply()) {
        note(isBlank(*stale) ? Habit::EmptyReply : Habit::StaleReply);
    }
    if (!isBlank(m_buffer)) {
        note(Habit::StaleReply);
        tellReceived(m_buffer);
    }
    m_buffer.clear();
}

// Takes the oldest whole reply out of what has come, and shows it to the loggers.
std::optional<std::string> FastChannel::cutReply()
{
    std::size_t const end = m_buffer.find(m_delimiter);
    if (end == std::string::npos) {
        return std::nullopt;
    }
    std::string reply = m_buffer.substr(0, end);
    m_buffer.erase(0, end + 1);
    tellReceived(reply);
    return reply;
}

void FastChannel::hear(std::string const& bytes)
{
    if (bytes.empty()) {
        return;
    }
    m_buffer += bytes;
    if (m_buffer.size() > longestReply) {
        m_lost = true;
        return;
    }
    if (m_pending) {
        m_pending->heard = true;
        m_pending->heardAt = m_wire->now();
        if (std::any_of(bytes.begin(), bytes.end(), [](char c) { return hexDigitValue(c) >= 0; })) {
            m_pending->dataAt = m_pending->heardAt;
        }
    }
    takeReplies();
}

void FastChannel::takeReplies()
{
    while (m_ready.empty()) {
        std::optional<std::string> const reply = cutReply();
        if (!reply) {
            return;
        }
        if (m_pending) {
            finish(*reply);
        } else {
            m_ready.push_back(*reply);
        }
    }
}

ReplyContext FastChannel::context() const
{
    return {m_pending->command, m_pending->sent, m_state.shownBus(), m_state.echoOff(), m_pending->extended};
}

// The prompt has come. Either the reply is handed on, or the request goes out once more and stays pending.
void FastChannel::finish(std::string const& raw)
{
    WireTime const took = m_wire->now() - m_pending->sentAt;
    HealedReply const reply = m_healer.heal(raw, context());
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
    } else if (shouldAskAgain(reply)) {
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

// An exchange of the channel's own, between those of the core.
std::optional<std::string> FastChannel::ask(std::string const& text, WireTime limit)
{
    write(text);
    return awaitReply(m_wire->now() + limit + m_options.latency);
}

std::optional<std::string> FastChannel::awaitReply(WireTime until)
{
    while (isValid()) {
        std::optional<std::string> const reply = cutReply();
        if (reply && !isBlank(*reply)) {
            return reply;
        }
        if (reply) {
            note(Habit::EmptyReply);
            continue;
        }
        std::string const bytes = m_wire->read(until);
        if (bytes.empty() && m_wire->now() >= until) {
            return std::nullopt;
        }
        m_buffer += bytes;
    }
    return std::nullopt;
}

bool FastChannel::confirms(std::string const& text, WireTime limit)
{
    std::optional<std::string> const reply = ask(text, limit);
    return reply && compactText(*reply).find("OK") != std::string::npos;
}

} // namespace velmora
