// An address that stays for several requests, and what a broken link leaves an adapter set to.

#include "libvelmora/channel/fastchannel.h"

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

constexpr WireTime stayLimit{700};

bool setsSame(AddressChange const& one, AddressChange const& other)
{
    return addressWord(one.set) == addressWord(other.set);
}

} // namespace

AddressedReply FastChannel::takeReply()
{
    std::lock_guard const lock(m_sharedMutex);
    auto const found = m_addresses.find(std::this_thread::get_id());
    return found != m_addresses.end() ? std::exchange(found->second.reply, {}) : AddressedReply();
}

void FastChannel::tellReply(HealedReply const& reply)
{
    std::lock_guard const lock(m_sharedMutex);
    if (auto const found = m_addresses.find(m_pending->asker); found != m_addresses.end()) {
        found->second.reply = {true, reply.lines, reply.error, reply.dropped};
    }
}

// What was monitored up to the interruption.
void FastChannel::tellHeard(std::string const& raw)
{
    HealedReply heard;
    for (ReplyLine const& line : splitReply(raw, m_habits)) {
        heard.lines.push_back(line.text);
    }
    tellReply(heard);
}

// From the address that is in force, or from none: each command costs 15 to 90 ms on slow adapters, so only what
// differs goes out. False with the command that the adapter did not take.
bool FastChannel::moveStay(std::vector<AddressChange> const& changes, std::string& refused)
{
    std::vector<AddressChange> const before = std::exchange(m_stayChanges, {});
    auto const isIn = [](std::vector<AddressChange> const& list, AddressChange const& change, auto const& same) {
        return std::any_of(list.begin(), list.end(), [&](AddressChange const& each) { return same(each, change); });
    };
    // What the new address does not set goes back to what it was.
    std::vector<AddressStep> kept;
    for (AddressStep const& step : std::exchange(m_restore, {})) {
        auto const source = std::find_if(before.begin(), before.end(),
                                         [&step](AddressChange const& each) { return each.restore == step; });
        (source != before.end() && isIn(changes, *source, setsSame) ? kept : m_restore).push_back(step);
    }
    std::vector<AddressStep> const gone = m_restore;
    restoreAddress();
    if (!m_restore.empty()) {
        m_restore.insert(m_restore.end(), kept.begin(), kept.end());
        refused = gone.front().command;
        return false;
    }
    m_restore = kept;
    auto const sameText = [](AddressChange const& one, AddressChange const& other) { return one.set == other.set; };
    for (AddressChange const& change : changes) {
        if (isIn(before, change, sameText)) {
            continue;
        }
        bool const noted = isIn(before, change, setsSame);
        refused = takeOn({noted ? AddressChange{change.set, {}} : change});
        if (!refused.empty()) {
            return false;
        }
    }
    m_stayChanges = changes;
    return true;
}

void FastChannel::endStay()
{
    if (m_staying || !m_stayChanges.empty()) {
        m_staying.reset();
        m_stayChanges.clear();
        restoreAddress();
    }
}

// Before the first command, and again where more is to be given back: which of the settings a broken link leaves in
// force nobody knows, so that the note holds them all.
void FastChannel::noteStay(std::vector<AddressChange> const& changes)
{
    std::vector<std::string> commands = m_noted;
    for (AddressChange const& change : changes) {
        std::string const& back = change.restore.command;
        if (!back.empty() && std::find(commands.begin(), commands.end(), back) == commands.end()) {
            commands.push_back(back);
        }
    }
    std::stable_sort(commands.begin(), commands.end(), [](std::string const& one, std::string const& other) {
        return restoreOrder(one) < restoreOrder(other);
    });
    if (commands != m_noted) {
        m_noted = commands;
        m_returns.put(m_options.port, {m_state.protocol(), commands});
    }
}

void FastChannel::strikeNote()
{
    if (m_restore.empty() && !m_noted.empty() && !m_lost) {
        m_returns.strike(m_options.port);
        m_noted.clear();
    }
}

// What an earlier connection could not give back. The header of another bus would be worse than none, so it goes out
// only where the adapter still stands on the bus of that time: after a loss of power nothing is left of it.
void FastChannel::giveLeftOversBack()
{
    std::optional<ReturnNote> const note = m_returns.find(m_options.port);
    if (!note) {
        return;
    }
    std::optional<std::string> told = ask("ATDPN", stayLimit);
    if (told && compactText(*told).ends_with("?")) {
        told = ask("ATDPN", stayLimit); // the rest of a line had stood before it
    }
    if (!told) {
        return; // the core finds out that nobody is there
    }
    std::string const bus = compactText(*told);
    bool const same = !bus.empty() && note->protocol != 0 && bus.back() == static_cast<char>('0' + note->protocol);
    for (std::string const& command : note->commands) {
        bool const ofBus = command.starts_with("ATSH") || command.starts_with("ATCP");
        if (ofBus && !same) {
            continue;
        }
        std::optional<std::string> const reply = ask(command, stayLimit);
        if (!reply) {
            return;
        }
        if (command == "ATCRA" && compactText(*reply).ends_with("?")) {
            ask("ATAR", stayLimit); // before level 1.4b
        }
    }
    m_returns.strike(m_options.port);
}

} // namespace velmora
