#pragma once

#include "libvelmora/channel/habit.h"

#include <string>
#include <string_view>
#include <vector>

namespace velmora {

// What a line of an adapter's reply to a request is.
enum class LineKind : int
{
    Data,    // digits
    Notice,  // SEARCHING..., BUS INIT: OK: says what the adapter does, and means nothing for the reply
    Error,   // NO DATA, CAN ERROR, ...
    Flagged, // digits that the adapter marks as wrong
    Refused, // ?
    Text     // anything else
};

struct ReplyLine
{
    std::string text; // without bytes that no reply holds
    bool stray;       // held some of them
};

// Cuts a reply at its line ends, whichever they are, takes out what no line holds, and leaves empty lines away.
std::vector<ReplyLine> splitReply(std::string_view raw, HabitCounts& counts);

// A line, blanks removed and in upper case, with the notices in front of it taken off; data is what is left.
struct ClassifiedLine
{
    LineKind kind;
    bool hadNotice;
    std::string text;
};
ClassifiedLine classifyLine(std::string_view line);

// Whether a line says that the adapter has reset itself: its banner, a word for low supply, an internal error.
bool tellsReset(std::string_view line);

} // namespace velmora
