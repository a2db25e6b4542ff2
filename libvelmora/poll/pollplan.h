#pragma once

#include "libvelmora/poll/multilimit.h"
#include "libvelmora/read/multireply.h"

#include <map>
#include <optional>
#include <vector>

namespace velmora {

// A parameter of one control module that is to be polled.
struct PollWish
{
    unsigned int module = 0;
    unsigned char pid = 0;
    std::optional<double> hertz;
    bool derived = false; // worked out from others: it asks for its inputs itself
};

// One turn on the bus, and whom it serves.
struct PollTask
{
    std::vector<unsigned char> pids;  // none for a derived value
    std::vector<std::size_t> members; // indexes of wishes
    std::optional<double> hertz;
};

using MultiLimits = std::map<unsigned int, MultiLimit>; // by module

// Puts wishes together to requests: the same PID of several modules to one, since all answer a broadcast, and on top of
// that several PIDs of the same rate as far as all modules that are meant take them. Groups are as even as can be, and
// always the same for the same wishes, so that an adapter's habits can be learnt by the text of a request. A module
// without a limit takes one PID.
std::vector<PollTask> planPolling(std::vector<PollWish> const& wishes, MultiLimits const& limits,
                                  PidLength const& length);

// Divides PIDs into even groups of at most so many, one or more.
std::vector<std::vector<unsigned char>> evenGroups(std::vector<unsigned char> const& pids, std::size_t most);

} // namespace velmora
