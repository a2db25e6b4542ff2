#pragma once

#include <obd/vehicleprotocol.h>

#include <memory>

namespace obd {

class IConnectionLogger;
class IDataConnection;
class IDevice;
class IObdProxy;

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

    virtual void onPhaseChanged(int phase) = 0; ///< a ConnectionPhase
};

/// Owns the life of one connection. Listeners and loggers are not owned: who adds one removes it before it dies.
///
///     auto const manager = car->getConnectionManager();
///     if (!manager->openConnection(bridge, obd::VehicleProtocol::Automatic, false)) { // seconds to minutes
///         bool const isAdapter = manager->getAdapter() != nullptr;                    // then the vehicle is silent
///         manager->closeConnection();                                                 // and a fresh bridge next time
///     }
class IConnectionManager
{
public:
    virtual ~IConnectionManager() = default;

    /// One that is added twice is told twice.
    virtual void addPhaseListener(IConnectionPhaseListener* listener) = 0;
    /// Removes the first equal entry.
    virtual void removePhaseListener(IConnectionPhaseListener* listener) = 0;

    /// Identifies the adapter, finds the vehicle and reads what its control modules support. Blocks for seconds to
    /// minutes; invalidate() on the bridge makes it fail within 250 ms. restoreAdapter restores and resets the adapter
    /// first. After a failure call closeConnection, which takes the adapter down, and bring a fresh bridge for the next
    /// attempt. An open connection is replaced without being closed. Services may be built and dropped meanwhile, on
    /// the thread that dispatches: see IObdVelmora.
    virtual bool openConnection(std::shared_ptr<IDataConnection> const& connection, VehicleProtocol protocol,
                                bool restoreAdapter) = 0;

    /// Whether a connection is fully open.
    virtual bool isBusy() = 0;

    /// Sends the adapter to sleep, tells the services and drops all queued work. Waits for an opening and for the
    /// request under way. Not from the dispatcher's worker. Services may be built and dropped meanwhile, on the thread
    /// that dispatches, but observers that another thread attaches or detaches meanwhile race with the calls they get
    /// from here: see IObdVelmora.
    virtual void closeConnection() = 0;

    /// The adapter: from DeviceReady on, also where no vehicle was found, until the close. May be null.
    virtual std::shared_ptr<IDevice> getAdapter() = 0;
    /// Never null.
    virtual std::shared_ptr<IObdProxy> getProxy() = 0;

    /// A tap on the traffic of this connection and of those to come. Once removeLogger has returned, the logger is not
    /// called any more. Not from a logger's own call.
    virtual void addLogger(IConnectionLogger* logger) = 0;
    virtual void removeLogger(IConnectionLogger* logger) = 0; ///< one entry at a time; not from a logger's own call
};

} // namespace obd
