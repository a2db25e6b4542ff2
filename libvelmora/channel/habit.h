#pragma once

#include <array>
#include <cstddef>
#include <string_view>

namespace velmora {

// What adapters and modules do beside their data sheets, and what the channel did about it.
enum class Habit : int
{
    Echo,            // the command came back although the echo is off: taken off
    Notice,          // SEARCHING..., BUS INIT: OK and such in front of data: taken off
    StrayBytes,      // NUL, FC and other bytes that no reply holds: taken out
    BrokenLine,      // a line that is not whole: dropped
    FlaggedLine,     // <DATA ERROR or <RX ERROR behind a line: dropped
    Padding,         // filling behind a frame's own bytes: cut
    ShortLastFrame,  // the last frame of a message without filling: filled up
    OrphanFrame,     // a consecutive frame without its first one: dropped
    RepeatedFrame,   // a frame of a message twice: dropped
    ForeignReply,    // the answer to another request beside the right one: dropped
    PendingReply,    // "response pending" in front of the answer: dropped
    TrailingError,   // an error word behind good lines: dropped
    EmptyReply,      // a prompt without a reply: waited on
    StaleReply,      // something said between two exchanges: dropped
    LatePrompt,      // a prompt behind the host's patience: waited out
    LostPrompt,      // a prompt that never came: the adapter was woken
    AskedAgain,      // a reply that brought nothing usable: asked once more
    UnfinishedCount, // a counted reply with something missing: asked plainly
    SettingsLost,    // the adapter had reset itself: set up again
};

constexpr std::size_t habitCount = 19;

// How often each habit was met.
using HabitCounts = std::array<unsigned int, habitCount>;

// In words for people, such as "echo that stays on".
std::string_view habitName(Habit habit);

} // namespace velmora
