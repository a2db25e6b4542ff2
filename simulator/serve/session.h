#pragma once

#include "simulator/simulation.h"

#include <cstdint>
#include <functional>

namespace obdsim {

/// What to serve, and how.
struct SessionOptions
{
    std::string listen = "tcp://127.0.0.1:35000"; ///< port 0: any free one; or "pty"
    SimulationOptions simulation;
    std::string replay;         ///< path of a recorded dialogue, in place of a car
    std::size_t fleet = 1;      ///< so many cars, each with an address of its own
    std::string trace;          ///< file of all that passes
    std::string written;        ///< scenario file of what control lines have changed, written at the end
    std::optional<int> control; ///< port of control lines; 0: any free one
    bool input = true;          ///< control lines from standard input, too
};

/// Serves simulated cars in real time: addresses, control lines, trace.
class Session
{
public:
    /// Throws SimulatorError, ServerError for an address.
    explicit Session(SessionOptions const& options);
    ~Session();
    Session(Session const&) = delete;
    Session& operator=(Session const&) = delete;

    /// What clients connect to, one for each car.
    std::vector<std::string> addresses() const;

    /// Where control lines are taken; empty without a control port.
    std::string controlAddress() const;

    /// Serves until stop(), which may come from any thread.
    void run();
    void stop();

    /// Whether the trace could not be written to its end, which is told on standard error when it happens.
    bool traceFailed() const;

private:
    class Impl;
    std::unique_ptr<Impl> m_impl;
};

} // namespace obdsim
