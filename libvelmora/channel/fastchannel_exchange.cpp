// One exchange with the adapter, from the command to its prompt.

#include "libvelmora/channel/fastchannel.h"

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

// No reply of a vehicle comes near it.
constexpr std::size_t longestReply = 1U << 20U;

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
    pending.latency = latency();
    pending.begunAt = m_wire->now();
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
        recallWait();
        writePending("ATTP" + std::to_string(m_triedProtocol));
    } else {
        writePending(text + (m_pending->count ? std::to_string(*m_pending->count) : ""));
    }
}

void FastChannel::write(std::string const& text)
{
    drain();
    writeLine(text);
}

void FastChannel::writeLine(std::string const& text)
{
    ++m_working.exchanges;
    m_wire->write(text + "\r");
    m_silence.wrote(m_wire->now());
    tellSent(text + "\r");
}

std::string FastChannel::listen(WireTime until)
{
    std::string bytes = m_wire->read(until);
    if (!bytes.empty()) {
        m_silence.heard();
    }
    return bytes;
}

void FastChannel::writePending(std::string const& text)
{
    write(text);
    m_pending->sent = compactText(text);
    m_pending->sentAt = m_wire->now();
    m_pending->heardAt = m_pending->sentAt;
    m_pending->dataAt = m_pending->sentAt;
    m_pending->heard = false;
    m_pending->cutAt.reset();
}

// What was said since the last prompt is no answer to what comes now.
void FastChannel::drain()
{
    m_buffer += listen(m_wire->now());
    while (std::optional<std::string> const stale = cutReply()) {
        if (!isOwed(*stale)) {
            note(isBlank(*stale) ? Habit::EmptyReply : Habit::StaleReply);
        }
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
        // Behind a cut comes the word for it, which is no data.
        bool const digits = std::any_of(bytes.begin(), bytes.end(), [](char c) { return hexDigitValue(c) >= 0; });
        if (digits && !m_pending->cutAt) {
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
        bool const mayBeOwn = m_pending && (m_pending->command.text() == "ATI" || m_pending->command.resets());
        if (!mayBeOwn && isOwed(*reply)) {
            continue;
        }
        if (m_pending) {
            noteLateness();
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

// An exchange of the channel's own, between those of the core.
std::optional<std::string> FastChannel::ask(std::string const& text, WireTime limit)
{
    write(text);
    WireTime const until = m_wire->now() + limit + latency();
    std::optional<std::string> reply = awaitReply(until);
    while (reply && isOwed(*reply)) {
        reply = awaitReply(until);
    }
    return reply;
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
        std::string const bytes = listen(until);
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
