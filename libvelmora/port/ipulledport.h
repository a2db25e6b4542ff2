#pragma once

#include "libvelmora/port/iport.h"

#include <chrono>
#include <string>

namespace velmora {

// A port whose bytes may also be fetched by who waits for them, in place of a thread of its own that hands them on: a
// reply then wakes one thread rather than two.
class IPulledPort : public IPort
{
public:
    using Moment = std::chrono::steady_clock::time_point;

    // Puts all that has come behind bytes; waits until then for the first of it, or until it is interrupted. False once
    // the link is gone for good. In place of start, by one thread at a time, and not beside close.
    virtual bool pull(std::string& bytes, Moment until) = 0;
    // Ends the pull that is under way, or else the next one that would wait. Any thread.
    virtual void interrupt() = 0;
    // Whether the link stands, as far as the system tells without a read. Any thread.
    virtual bool isUp() = 0;
};

} // namespace velmora
