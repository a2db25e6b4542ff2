#pragma once

namespace obd {

/// Hears a connection's opening and closing on the thread that opens or closes it, while the lists are locked: return
/// at once, and don't attach, detach or build services.
class IConnectionNotifierListener
{
public:
    virtual ~IConnectionNotifierListener() = default;

    virtual void onConnectionOpened() = 0;
    virtual void onConnectionClosed() = 0;
};

/// Tells opening and closing in the order of three priorities: 0 the control modules, 1 the services, 2 the connection
/// service. Other priorities are ignored. Listeners are not owned.
class IConnectionNotifier
{
public:
    virtual ~IConnectionNotifier() = default;

    virtual bool isConnected() = 0;
    virtual void attach(unsigned int priority, IConnectionNotifierListener* listener) = 0;
    /// Removes every entry of the listener at that priority.
    virtual void detach(unsigned int priority, IConnectionNotifierListener* listener) = 0;
};

} // namespace obd
