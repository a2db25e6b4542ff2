#pragma once

#include <chrono>
#include <string>
#include <string_view>

namespace velmora {

// A point of a wire's own clock.
using WireTime = std::chrono::milliseconds;

// The bytes to and from an adapter, with the clock that goes with them. One thread at a time talks through it.
class IWire
{
public:
    virtual ~IWire() = default;

    virtual void write(std::string_view bytes) = 0;
    // All bytes that have come; waits for the first of them until then. Empty if the time ran out or the link is gone.
    virtual std::string read(WireTime until) = 0;
    virtual WireTime now() const = 0;
    // False once the link is gone for good. Any thread.
    virtual bool isUp() const = 0;
    // Gives the link up: a read that is under way ends soon. Any thread.
    virtual void giveUp() = 0;
    // Takes that back, for last words. False if the link itself is gone.
    virtual bool resume() = 0;
};

} // namespace velmora
