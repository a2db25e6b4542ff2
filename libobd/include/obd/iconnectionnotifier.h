#pragma once

namespace obd {

/// Hears a connection's opening and closing on the thread that opens or closes it, while the lists are locked: return
/// at once, and don't attach, detach or build services.
class IConnectionNotifierListener
{
public:
    virtual ~IConnectionNotifierListener() = default;

    virtual void onConnectionOpened() = 0; ///< vehicle link and control modules are up
    virtual void onConnectionClosed() = 0; ///< the connection is going down
};

/// Tells opening and closing in the order of three priorities: 0 the control modules, 1 the services, 2 the connection
/// service. Other priorities are ignored. Listeners are not owned.
class IConnectionNotifier
{
public:
    virtual ~IConnectionNotifier() = default;

    virtual bool isConnected() = 0; ///< whether a connection is open
    virtual void attach(unsigned int priority, IConnectionNotifierListener* listener) = 0; ///< at its end of the list
    /// Removes every entry of the listener at that priority.
    virtual void detach(unsigned int priority, IConnectionNotifierListener* listener) = 0;
};

} // namespace obd
