#pragma once

#include <obd/export.h>
#include <tervex/inotifier.h>

#include <memory>
#include <string>

namespace obd {

class IAdapter;
class IConnectionOptions;

/// Hears of the connection and of the control module that is selected.
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

/// The state of the connection for the application. Opens and closes nothing itself: that is IConnectionManager's.
class IConnectionService : public virtual tervex::INotifier<IConnectionServiceObserver>
{
public:
    virtual bool isConnected() const = 0; ///< whether adapter, vehicle and control modules are up
    /// The OBD standard that the current control module reports; empty if there is none.
    virtual std::string standardDescription() const = 0;
    virtual IConnectionOptions* connectionOptions() const = 0; ///< lives as long as the settings
    /// Null without an adapter.
    virtual std::shared_ptr<IAdapter> adapter() const = 0;
};

namespace ConnectionServiceBuilder {

/// The one connection service of the process while somebody holds it; a new one after the last holder let go. It
/// belongs to the top-level object that was the latest when it was made, which must outlive it; null before the first
/// one. Call from any thread; let go of the last reference on the thread that dispatches: see IObdVelmora.
OBD_EXPORT std::shared_ptr<IConnectionService> createConnectionService();

} // namespace ConnectionServiceBuilder

} // namespace obd
