#include "libvelmora/channel/habit.h"

namespace velmora {

std::string_view habitName(Habit habit)
{
    static constexpr std::array<std::string_view, habitCount> names = {
        "echo that stays on",
        "notices in front of data",
        "stray bytes taken out",
        "broken lines dropped",
        "lines that the adapter flagged as wrong",
        "filling cut off",
        "last frames without filling",
        "frames without their beginning",
        "frames that came twice",
        "answers to other requests dropped",
        "\"response pending\" in front of an answer",
        "error words behind good lines",
        "prompts without a reply",
        "replies that came unasked",
        "late prompts waited out",
        "lost prompts",
        "requests asked once more",
        "counted replies with something missing",
        "resets of the adapter",
    };
    return names[static_cast<std::size_t>(habit)];
}

} // namespace velmora
