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

} // namespace obd
