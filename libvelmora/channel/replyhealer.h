#pragma once

#include "libvelmora/channel/busline.h"
#include "libvelmora/channel/elmcommand.h"
#include "libvelmora/channel/habit.h"
#include "libvelmora/channel/replylines.h"

#include <cstdint>
#include <map>
#include <set>
#include <string>
#include <string_view>
#include <vector>

namespace velmora {

class ModuleMessages;
struct ModuleMessage;

// What a reply is an answer to, and how the adapter shows it.
struct ReplyContext
{
    ElmCommand command;
    std::string sent;               // what was really sent, which an adapter may echo
    BusKind bus = BusKind::Unknown; // Unknown while headers are off: the lines are then texts
    bool echoOff = false;           // the adapter was told to leave the echo away
    bool extended = false;          // CAN: frames begin with an address byte; it is taken out
};

// A reply as it is handed on, and what is known of it.
struct HealedReply
{
    std::vector<std::string> lines;
    // Frames of each module that answered, and its last whole message.
    std::map<unsigned int, unsigned int> frames;
    std::map<unsigned int, std::vector<std::uint8_t>> messages;
    std::set<unsigned int> spoke; // every module of which a frame came
    std::string error;            // the first word of trouble of the adapter, without blanks
    bool silent = false;          // not a line in it
    bool echoed = false;          // the command came back though the echo is off
    bool refused = false;         // ?
    bool reset = false;           // the adapter says that it has started anew
    bool notices = false;
    bool data = false;      // digits are handed on
    bool pending = false;   // a module asked for patience and has not answered
    bool answered = false;  // a whole message that answers the request
    bool dropped = false;   // something of it was not fit to be handed on
    bool doubtful = false;  // frames of the reply before may stand in it: dropped
    bool irregular = false; // holds what a counted reply must not hold: refusals, foreign answers, texts

    // The lines, each with its end.
    std::string text() const;
    // Every module's answer whole, and nothing else.
    bool whole() const
    {
        return answered && error.empty() && !dropped && !irregular && !pending && !refused && !notices;
    }
    std::size_t frameCount() const;
};

// Takes out of replies what makes them unreadable. It never changes or adds a byte of data: what is not whole goes.
class ReplyHealer
{
public:
    // The counts must outlive it.
    explicit ReplyHealer(HabitCounts& counts) : m_counts(counts) {}

    // raw ends where the prompt stood.
    HealedReply heal(std::string_view raw, ReplyContext const& context);

private:
    struct Entry
    {
        std::string original;
        ClassifiedLine line;
        bool stray;
        bool keep;

        // Data without blanks and notices, all else as it came.
        std::string const& text() const { return line.kind == LineKind::Data ? line.text : original; }
    };

    HealedReply healText(std::vector<ReplyLine> const& lines) const;
    HealedReply healRequest(std::vector<ReplyLine> const& lines, ReplyContext const& context);
    void readFrames(std::vector<Entry>& entries, ReplyContext const& context, HealedReply& reply);
    bool isTrusted(Entry const& entry, BusKind bus);
    void judge(ModuleMessages& messages, std::vector<Entry>& entries, ReplyContext const& context, HealedReply& reply);
    static void showPlainly(ModuleMessages& messages, std::vector<Entry>& entries);
    void dropBehindData(std::vector<Entry>& entries, HealedReply& reply);
    void note(Habit habit) { ++m_counts[static_cast<std::size_t>(habit)]; }

    HabitCounts& m_counts;
    int m_rightCheckBytes = 0; // in a row
    // Frames that the reply before still owes, by module: they may come in the next one.
    std::map<unsigned int, std::size_t> m_owed;
};

} // namespace velmora
