#pragma once

#include "libvelmora/channel/busline.h"
#include "libvelmora/channel/habit.h"

#include <cstddef>
#include <map>
#include <vector>

namespace velmora {

// One message of a module in a reply, and the lines that bring it.
struct ModuleMessage
{
    unsigned int module = 0;
    std::size_t length = 0;  // bytes that it is to have
    std::size_t carried = 7; // bytes of a consecutive frame
    std::vector<std::uint8_t> payload;
    std::vector<std::string> lines;  // as they are handed on
    std::vector<std::size_t> places; // of the lines in the reply
    std::size_t headerDigits = 3;    // in front of each line
    bool broken = false;             // two frames claim the same place: nothing of it can be trusted
    bool inOrder = true;

    bool complete() const { return !broken && payload.size() >= length; }
    std::size_t missingFrames() const { return complete() ? 0 : (length - payload.size() + carried - 1) / carried; }
    bool segmented() const { return length > carried; }
};

// Puts the frames of a reply together by the rules of ISO 15765-2; those of several modules may come mixed. On the
// legacy buses each frame is a message.
class ModuleMessages
{
public:
    // extended: frames hold an address byte, and a byte less of the message.
    ModuleMessages(BusKind bus, HabitCounts& counts, bool extended = false)
        : m_bus(bus), m_counts(counts), m_carried(extended ? 6 : 7)
    {}

    // False if the frame belongs to no message, or lacks bytes that it should have: it is to be dropped.
    bool add(BusLine const& line, std::string const& digits, std::size_t place);

    std::vector<ModuleMessage>& all() { return m_messages; }
    // How many consecutive frames of a module came that belong to no message of it here.
    std::size_t orphans(unsigned int module) const
    {
        auto const found = m_orphans.find(module);
        return found != m_orphans.end() ? found->second : 0;
    }

private:
    bool addConsecutive(BusLine const& line, std::string const& digits, std::size_t place);
    ModuleMessage* open(unsigned int module);
    void note(Habit habit) { ++m_counts[static_cast<std::size_t>(habit)]; }

    BusKind m_bus;
    HabitCounts& m_counts;
    std::size_t m_carried; // bytes of a consecutive frame
    std::vector<ModuleMessage> m_messages;
    std::map<unsigned int, std::size_t> m_orphans;
};

// The frames of a message as a module without an address byte would send it, filled up with 00.
std::vector<std::string> plainFrames(std::string const& header, std::vector<std::uint8_t> const& payload);

} // namespace velmora
