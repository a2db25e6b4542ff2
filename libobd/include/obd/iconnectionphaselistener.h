#pragma once

namespace obd {

/// Phases of a connection, as onPhaseChanged is told them. 1 and 2 are not in use.
enum ConnectionPhase : int
{
    Closed = 0,      ///< the connection is going down
    DeviceReady = 3, ///< the adapter is identified and configured; the search for the vehicle begins
    Connected = 4,   ///< vehicle link and control modules are up
};

/// Hears the phases of a connection, on the thread that opens or closes it, while that is locked: an implementation
/// must not open, close, add or remove listeners, and returns quickly.
class IConnectionPhaseListener
{
public:
    virtual ~IConnectionPhaseListener() = default;

    virtual void onPhaseChanged(int phase) = 0;
};

} // namespace obd
