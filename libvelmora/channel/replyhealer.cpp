#include "libvelmora/channel/replyhealer.h"

#include <algorithm>
#include <utility>

namespace velmora {

std::string HealedReply::text() const
{
    std::string text;
    for (std::string const& line : lines) {
        text += line + "\r";
    }
    return text;
}

std::size_t HealedReply::frameCount() const
{
    std::size_t count = 0;
    for (auto const& [module, moduleFrames] : frames) {
        count += moduleFrames;
    }
    return count;
}

HealedReply ReplyHealer::heal(std::string_view raw, ReplyContext const& context)
{
    std::vector<ReplyLine> lines = splitReply(raw, m_counts);
    bool const silent = lines.empty();
    bool const echoed = context.echoOff && !lines.empty() && compactText(lines.front().text) == context.sent;
    if (echoed) {
        note(Habit::Echo);
        lines.erase(lines.begin());
    }
    HealedReply reply = context.command.isRequest() ? healRequest(lines, context) : healText(lines);
    reply.silent = silent;
    reply.echoed = echoed;
    reply.reset = std::any_of(lines.begin(), lines.end(), [](ReplyLine const& line) { return tellsReset(line.text); });
    return reply;
}

HealedReply ReplyHealer::healText(std::vector<ReplyLine> const& lines) const
{
    HealedReply reply;
    for (ReplyLine const& line : lines) {
        ClassifiedLine const classified = classifyLine(line.text);
        if (classified.kind == LineKind::Error && reply.error.empty()) {
            reply.error = classified.text;
        }
        reply.refused = reply.refused || classified.kind == LineKind::Refused;
        reply.lines.push_back(line.text);
    }
    return reply;
}

HealedReply ReplyHealer::healRequest(std::vector<ReplyLine> const& lines, ReplyContext const& context)
{
    HealedReply reply;
    std::vector<Entry> entries;
    for (ReplyLine const& line : lines) {
        entries.push_back({line.text, classifyLine(line.text), line.stray, true});
    }
    for (Entry const& entry : entries) {
        reply.notices = reply.notices || entry.line.hadNotice;
        reply.refused = reply.refused || entry.line.kind == LineKind::Refused;
        reply.irregular = reply.irregular || entry.line.kind == LineKind::Text;
        if (entry.line.kind == LineKind::Error && reply.error.empty()) {
            reply.error = entry.line.text;
        }
    }
    if (context.bus != BusKind::Unknown) {
        readFrames(entries, context, reply);
    }
    dropBehindData(entries, reply);
    for (Entry const& entry : entries) {
        if (entry.keep) {
            reply.lines.push_back(entry.text());
            reply.data = reply.data || entry.line.kind == LineKind::Data;
        }
    }
    return reply;
}

void ReplyHealer::dropBehindData(std::vector<Entry>& entries, HealedReply& reply)
{
    bool const data = std::any_of(entries.begin(), entries.end(),
                                  [](Entry const& entry) { return entry.keep && entry.line.kind == LineKind::Data; });
    for (Entry& entry : entries) {
        if (data && entry.line.hadNotice) {
            note(Habit::Notice);
        }
        bool const trouble = entry.line.kind == LineKind::Error || entry.line.kind == LineKind::Refused;
        if (data && (entry.line.kind == LineKind::Notice || entry.line.kind == LineKind::Text)) {
            entry.keep = false;
        } else if (reply.answered && trouble) {
            note(Habit::TrailingError);
            entry.keep = false;
        }
    }
}

} // namespace velmora
