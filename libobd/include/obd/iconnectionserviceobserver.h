#pragma once

namespace obd {

class IConnectionServiceObserver
{
public:
    virtual ~IConnectionServiceObserver() = default;

    /// On the application's thread, inside Dispatcher::dispatch.
    virtual void onConnectionOpened() = 0;
    /// On the thread that selected another control module or closes the connection.
    virtual void onActiveEcuChanged() = 0;
    /// On the application's thread, inside Dispatcher::dispatch.
    virtual void onConnectionClosed() = 0;
};

} // namespace obd
