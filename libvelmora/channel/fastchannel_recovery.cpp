// Prompts that are late or never come, adapters that stopped listening or lost their settings.

#include "libvelmora/channel/fastchannel.h"

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

constexpr WireTime never = WireTime::max();
// The core gives a command 500 and 200 ms; an adapter that is awake begins within a tenth of that.
constexpr WireTime commandSilence{600};
// Slow clones send the prompt up to 350 ms behind the reply; a command's reply has no other pauses.
constexpr WireTime commandQuiet{400};
// Behind the last frame an adapter waits as long as ATST says, 1.044 s at most, and for a module that asks for
// patience.
constexpr WireTime longestWait{1044};
constexpr WireTime requestQuiet{300};
constexpr WireTime pendingQuiet{5300};
constexpr WireTime wakeLimit{700};
constexpr WireTime stoppedLimit{200};
constexpr WireTime settingLimit{1000};
constexpr WireTime restartPause{1000};
constexpr WireTime resetsTooClose{60000};
constexpr double waitStepMs = 4.096;

WireTime waitOf(std::string const& setting)
{
    if (setting.size() <= 4) {
        return longestWait;
    }
    unsigned int steps = 0;
    for (char const digit : setting.substr(4)) {
        steps = steps * 16 + static_cast<unsigned int>(std::max(hexDigitValue(digit), 0));
    }
    return steps == 0 ? longestWait : WireTime(static_cast<int>(steps * waitStepMs));
}

} // namespace

// When silence means that no prompt will come. A search for the bus, or a slow start of it, has no such time; but one
// that did not say who it is before is asked that again before it is taken for gone.
WireTime FastChannel::remedyTime() const
{
    Pending const& pending = *m_pending;
    if (pending.woken || pending.command.resets() || pending.command.monitors()) {
        return never;
    }
    if (m_silent) {
        return std::max(m_silence.end(), pending.sentAt + commandSilence + latency());
    }
    if (!pending.command.isRequest()) {
        return latency() + (pending.heard ? pending.heardAt + commandQuiet : pending.sentAt + commandSilence);
    }
    std::string const text = compactText(m_buffer);
    std::size_t const digits = text.find_last_of('.');
    bool const starting = text.starts_with("BUSINIT") || text.ends_with(".") || text == "OK" ||
                          text.ends_with("...OK") || (digits == std::string::npos && text.starts_with("SEARCH"));
    if (!pending.heard && m_busSpoke && isCanBus(m_state.shownBus())) {
        return m_silence.end(); // there is nothing to search or to start any more
    }
    if (!pending.heard || text.empty() || starting || text == pending.sent) {
        return never;
    }
    bool const patience = text.find("7F") != std::string::npos && text.find("78") != std::string::npos;
    return pending.heardAt + latency() +
           (patience ? pendingQuiet : std::min(waitOf(m_state.setting("ATST")), longestWait) + requestQuiet);
}

// Some of a reply has come and then nothing: it is complete, or the adapter has stopped listening. The identity command
// tells. What had come counts if it ends with a line.
void FastChannel::remedy()
{
    m_pending->woken = true;
    note(Habit::LostPrompt);
    ElmCommand const command = m_pending->command;
    if (command.text() == "ATI") {
        m_late.askedIdentity(m_wire->now()); // the first one
        writePending("ATI");
        return;
    }
    std::string before;
    if (!tryToWake(before)) {
        m_buffer.insert(0, before); // the rest may come yet
        return;
    }
    std::size_t const end = before.find_last_of("\r\n");
    before.erase(end == std::string::npos ? 0 : end);
    if (compactText(before) != m_pending->sent && !compactText(before).empty()) {
        finish(before);
    } else if (!command.isRequest() || command.onlyReads()) {
        writePending(m_pending->sent);
    }
}

// ATI, since a CR alone would repeat the last command, whatever that was. Its first character may only have stopped
// what the adapter was at, so there is a second try.
bool FastChannel::wake(std::string& before)
{
    constexpr int tries = 2;
    for (int i = 0; i < tries && isValid(); ++i) {
        before += m_buffer;
        m_buffer.clear();
        writeLine("ATI");
        m_late.askedIdentity(m_wire->now());
        WireTime until = m_wire->now() + wakeLimit + latency();
        while (std::optional<std::string> const reply = awaitReply(until)) {
            if (isIdentity(*reply)) {
                m_late.settledIdentity();
                tellReceived(before);
                return true;
            }
            bool const refused = compactText(*reply).ends_with("?");
            before += refused ? "" : *reply + "\r";
            if (refused) {
                break; // the rest of a command that was cut
            }
            if (compactText(*reply).ends_with("STOPPED")) {
                until = std::min(until,
                                 m_wire->now() + stoppedLimit + latency()); // it may have swallowed all of it
            }
        }
    }
    return false;
}

// Notes whether it could be woken. One that is gone is not asked on and on.
bool FastChannel::tryToWake(std::string& before)
{
    bool const awake = wake(before);
    if (!awake && !m_silent) {
        m_silentFrom = m_pending->heardAt;
        m_trouble.clear();
    }
    m_silent = !awake;
    if (!awake && m_silence.isGone(m_wire->now())) {
        m_gone = true;
        m_lost = true;
    }
    return awake;
}

// Not yet for one that pauses: slow clones do, for a second or two.
bool FastChannel::isSilent() const
{
    return m_silent && m_wire->now() - m_silentFrom >= LateAnswers::limit;
}

bool FastChannel::isIdentity(std::string const& reply) const
{
    std::string const text = compactText(reply);
    std::string const& known = m_state.identity();
    return known.empty() ? text.find("ELM") != std::string::npos : text.find(known) != std::string::npos;
}

// A banner or an error of the chip itself; or the echo is on again, which it is after each reset.
bool FastChannel::tellsLostSettings(HealedReply const& reply)
{
    ElmCommand const& command = m_pending->command;
    bool const mayShowBanner = command.resets() || command.startsWith("ATI") || command.startsWith("AT@") ||
                               command.startsWith("STI") || command.text() == "ATD";
    if (reply.reset && !mayShowBanner) {
        return true;
    }
    return reply.echoed && m_echoChecked && !m_echoStuck;
}

// Brings the adapter back to where it stood and asks once more what only reads. Twice within a minute is a link that
// can't be trusted. False if the reply is to be handed on as it is.
bool FastChannel::setUpAgain(HealedReply const& reply)
{
    WireTime const now = m_wire->now();
    note(Habit::SettingsLost);
    if (m_resetAt && now - *m_resetAt < resetsTooClose) {
        m_resets = true;
        m_lost = true;
        return false;
    }
    m_resetAt = now;
    if (reply.reset && !reply.error.empty()) {
        // LV RESET and ERR94 come before the adapter has started anew, and the supply may still be low. A banner in
        // this time is dropped below.
        m_buffer.clear();
        listen(now + restartPause);
    }
    if (m_state.protocol() == 0 && !reply.error.empty()) {
        // Behind LV RESET and ERR94 a search leaves CAN out until the adapter is told to forget them.
        confirms("ATFE", settingLimit);
    }
    for (std::string const& command : m_state.setUp()) {
        confirms(command, settingLimit);
    }
    m_waitSteps = 0;
    m_restore.clear(); // a reset has taken it back
    m_staying.reset();
    m_stayChanges.clear();
    m_learner.clear();
    ElmCommand const& command = m_pending->command;
    if (command.isRequest() && !command.onlyReads()) {
        return false;
    }
    m_pending->count.reset();
    m_pending->key = command.text();
    m_pending->addressed = false;
    if (!setAddress(*m_pending)) {
        return false;
    }
    writePending(command.text());
    return true;
}

} // namespace velmora
