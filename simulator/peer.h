#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <string_view>

namespace obdsim {

/// Virtual time of a simulated adapter, counted from its power-up. A character at 115200 baud takes 87 of these.
using Time = std::chrono::microseconds;
using Ms = std::chrono::milliseconds;

/// The far end of a byte channel: an adapter with a car behind it.
///
/// A peer never waits and has no thread. Its owner moves its clock: a test jumps
/// from output to output, a server follows the real clock. Not thread-safe; one
/// owner at a time.
class IPeer
{
public:
    virtual ~IPeer() = default;

    /// Bytes from the host, which arrive at now().
    virtual void receive(std::string_view bytes) = 0;

    /// When the next output is due; nothing if none is under way.
    virtual std::optional<Time> nextOutput() const = 0;

    /// When something happens to the peer by itself, though it may put nothing out: a line of a scenario.
    virtual std::optional<Time> nextWake() const { return nextOutput(); }

    /// Moves the clock to `time` and returns all that was put out up to then,
    /// in order. A time in the past leaves the clock where it is.
    virtual std::string advanceTo(Time time) = 0;

    virtual Time now() const = 0;

    /// A new host is on the line: unsent output and a half-typed command are
    /// dropped, settings stay. A lost link is up again.
    virtual void connect() = 0;

    /// False once the simulated link has broken; nothing comes or goes then.
    virtual bool linkIsUp() const = 0;
};

} // namespace obdsim
