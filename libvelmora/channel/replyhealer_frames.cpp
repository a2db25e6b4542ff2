// What of a reply's frames is handed on.

#include "libvelmora/channel/canmessagelist.h"
#include "libvelmora/channel/replyhealer.h"

#include <obd/nack.h>

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

enum class Answer : int
{
    Right,
    Refusal,
    Pending,
    Foreign
};

// Behind the service of a reply stands which item it is of, for the services that have items.
bool isOfRequest(std::vector<std::uint8_t> const& request, std::vector<std::uint8_t> const& payload)
{
    if (payload.empty() || payload[0] != obd::positiveReply(request[0])) {
        return false;
    }
    bool const hasItem = request.size() > 1 && request[0] != 0x03 && request[0] != 0x07 && request[0] != 0x0A;
    return !hasItem ||
           (payload.size() > 1 && std::find(request.begin() + 1, request.end(), payload[1]) != request.end());
}

Answer judgeAnswer(std::vector<std::uint8_t> const& request, std::vector<std::uint8_t> const& payload)
{
    if (isOfRequest(request, payload)) {
        return Answer::Right;
    }
    if (payload.size() > 1 && payload[0] == obd::negativeReply && payload[1] == request[0]) {
        // On SAE J1850 the request's own bytes stand between the service and the code.
        return payload.size() > 2 && payload.back() == obd::NackResponsePending ? Answer::Pending : Answer::Refusal;
    }
    return Answer::Foreign;
}

} // namespace

// What came without a loss in a line with strays: no frame is longer than eight bytes, and a check byte tells.
bool ReplyHealer::isTrusted(Entry const& entry, BusKind bus)
{
    constexpr int enoughToTell = 3;
    if (isCanBus(bus)) {
        std::size_t const whole = (bus == BusKind::Can11 ? 3U : 8U) + 16U;
        return !entry.stray || entry.line.text.size() == whole;
    }
    bool const right = hasRightCheckByte(bus, entry.line.text);
    bool const showsThem = m_rightCheckBytes >= enoughToTell;
    if (!showsThem) {
        m_rightCheckBytes = right ? m_rightCheckBytes + 1 : 0;
    }
    return right || (!entry.stray && !showsThem);
}

void ReplyHealer::readFrames(std::vector<Entry>& entries, ReplyContext const& context, HealedReply& reply)
{
    // Some adapters end each byte with a CR. Such lines are joined by who reads them.
    constexpr std::size_t longestPiece = 3;
    bool const inPieces = std::none_of(entries.begin(), entries.end(), [](Entry const& entry) {
        return entry.line.kind == LineKind::Data && entry.line.text.size() > longestPiece;
    });
    if (inPieces) {
        reply.irregular = true;
        return;
    }
    ModuleMessages messages(context.bus, m_counts, context.extended);
    for (std::size_t place = 0; place < entries.size(); ++place) {
        Entry& entry = entries[place];
        bool const cut = place + 1 < entries.size() && entries[place + 1].line.kind == LineKind::Error &&
                         entries[place + 1].line.text == "BUFFERFULL";
        if (entry.line.kind == LineKind::Flagged) {
            note(Habit::FlaggedLine);
            entry.keep = false;
        } else if (entry.line.kind == LineKind::Data) {
            auto const frame = parseBusLine(context.bus, entry.line.text, context.extended);
            if (cut || !frame || !isTrusted(entry, context.bus)) {
                note(Habit::BrokenLine);
                entry.keep = false;
            } else {
                reply.spoke.insert(frame->module);
                entry.keep = messages.add(*frame, entry.line.text, place);
            }
        }
        reply.dropped = reply.dropped || !entry.keep;
    }
    judge(messages, entries, context, reply);
    if (context.extended) {
        showPlainly(messages, entries);
    }
}

void ReplyHealer::judge(ModuleMessages& messages, std::vector<Entry>& entries, ReplyContext const& context,
                        HealedReply& reply)
{
    ElmCommand const& command = context.command;
    std::vector<ModuleMessage>& all = messages.all();
    auto const drop = [&entries, this](ModuleMessage const& message, Habit habit) {
        note(habit);
        for (std::size_t const place : message.places) {
            entries[place].keep = false;
        }
    };
    auto const owed = std::exchange(m_owed, {});
    for (std::size_t i = 0; i < all.size(); ++i) {
        ModuleMessage const& message = all[i];
        auto const owing = owed.find(message.module);
        // Its frames may be those of the message before: nothing but their numbers tells them apart.
        bool const doubtful = message.segmented() && message.complete() && owing != owed.end() &&
                              messages.orphans(message.module) < owing->second;
        if (message.missingFrames() != 0) {
            m_owed[message.module] = message.missingFrames();
        }
        Answer const answer = judgeAnswer(command.bytes(), message.payload);
        auto const answeredBy = [&](ModuleMessage const& other) {
            return other.module == message.module && other.complete() &&
                   judgeAnswer(command.bytes(), other.payload) == Answer::Right;
        };
        auto const behind = all.begin() + static_cast<std::ptrdiff_t>(i) + 1;
        for (std::size_t line = 0; line < message.lines.size(); ++line) {
            entries[message.places[line]].line.text = message.lines[line];
        }
        if (message.broken || doubtful) {
            drop(message, Habit::BrokenLine);
            reply.dropped = true;
            reply.doubtful = reply.doubtful || doubtful;
        } else if (answer == Answer::Right && message.complete()) {
            reply.answered = true;
            reply.irregular = reply.irregular || !message.inOrder;
            reply.frames[message.module] += static_cast<unsigned int>(message.lines.size());
            reply.messages[message.module] = message.payload;
        } else if (answer == Answer::Pending && std::any_of(behind, all.end(), answeredBy)) {
            drop(message, Habit::PendingReply);
            reply.irregular = true;
        } else if (answer == Answer::Pending) {
            reply.pending = true;
        } else if (answer == Answer::Foreign && std::any_of(all.begin(), all.end(), answeredBy)) {
            drop(message, Habit::ForeignReply);
            reply.irregular = true;
        } else {
            reply.irregular = true; // a refusal, half a message, or somebody else's answer alone
        }
    }
}

// Readers know nothing of address bytes: a whole message is handed on in the frames that it would have without one,
// half a message not at all.
void ReplyHealer::showPlainly(ModuleMessages& messages, std::vector<Entry>& entries)
{
    for (ModuleMessage const& message : messages.all()) {
        std::string const header = message.lines.front().substr(0, message.headerDigits);
        std::vector<std::string> const frames =
            message.complete() ? plainFrames(header, message.payload) : std::vector<std::string>();
        for (std::size_t i = 0; i < message.places.size(); ++i) {
            Entry& entry = entries[message.places[i]];
            entry.keep = entry.keep && i < frames.size();
            entry.line.text = i < frames.size() ? frames[i] : entry.line.text;
        }
    }
}

} // namespace velmora
