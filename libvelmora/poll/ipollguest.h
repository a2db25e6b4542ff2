#pragma once

#include "libvelmora/poll/pollresult.h"

#include <string>
#include <vector>

namespace velmora {

class PollWire;

// One value that a guest reads.
struct PollGuestWish
{
    unsigned int module = 0;
    int id = 0;         // of its results
    std::string sensor; // its key
};

// What takes turns on the bus among the PIDs of service 01, at a rate of its own. All but stop on the poller's thread.
class IPollGuest
{
public:
    virtual ~IPollGuest() = default;

    virtual std::vector<PollGuestWish> wishes() const = 0;

    // Takes one turn and gives what was told in it; a result without values says that the module told none.
    virtual std::vector<PollResult> turn(PollWire& wire) = 0;

    // Ends a turn soon. Any thread.
    virtual void stop() = 0;
};

} // namespace velmora
