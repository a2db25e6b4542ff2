#pragma once

#include <obd/export.h>
#include <tervex/notifier.h>

#include <memory>
#include <mutex>

namespace obd {

class DispatchQueue;
class IDispatchable;
class IObdProxy;

/// What an application attaches to the Dispatcher, to be told that there is work for its main thread.
class IDispatchRunner
{
public:
    virtual ~IDispatchRunner() = default;

    /// Arrange one call of Dispatcher::dispatch() on the main thread, soon: one for each call of this, not one for
    /// several. Called on any thread, the library's worker too. Return quickly, and don't call back into the library:
    /// calling dispatch() from here deadlocks or runs observers on the wrong thread.
    virtual void onDispatchRequested() = 0;
};

/// The one place where bus work runs. Adapter and vehicle can do one thing at a time, so a single worker thread takes
/// all work in the order of its arrival; what the application may see of it comes back through dispatch(), which the
/// application calls on its main thread. One for the process; it outlives everything and is never torn down.
///
/// An application needs getInstance(), attach() and detach() of its IDispatchRunner, and dispatch(). The runners' list
/// has no lock: attach before the first connection, detach after the last, on the main thread.
///
///     struct Runner : tervex::Observer<obd::IDispatchRunner> {
///         void onDispatchRequested() override { eventLoop.post([] { obd::Dispatcher::getInstance().dispatch(); }); }
///     } runner;
///     obd::Dispatcher::getInstance().attach(&runner);
class OBD_EXPORT Dispatcher : public virtual tervex::Notifier<IDispatchRunner>
{
public:
    /// The one of the process. Any thread.
    static Dispatcher& getInstance();

    Dispatcher(Dispatcher const&) = delete;
    Dispatcher& operator=(Dispatcher const&) = delete;

    /// Does what is due on the main thread: the calls of observers, and with them the next round of live values. Call
    /// it once for each onDispatchRequested, never from inside it. Not for two threads at once, nor from inside itself.
    /// An observer's exception passes through; what was due behind it waits for the next call.
    void dispatch();

    /// The rest is the library's own.

    /// The proxy that work runs with from now on. Waits for a cancel that is under way.
    void setProxy(std::shared_ptr<IObdProxy> const& proxy);

    /// Queues work for the worker, from any thread. The reference is weak: work that nobody holds any more vanishes
    /// from the queue. The first work starts the worker, which takes a standing connection: false, with a log line,
    /// without.
    bool update(std::weak_ptr<IDispatchable> const& work);

    /// Queues work whose finish alone is wanted, on the main thread. Any thread. True.
    bool scheduleUiTask(std::weak_ptr<IDispatchable> const& work);

    /// Drops the queued work and that which waits for its finish, and stops the worker; waits for the work that the
    /// worker is at. What scheduleUiTask took stays. Any thread but the worker; from inside a finish too.
    void cancel();

private:
    class DispatcherImpl;

    Dispatcher();
    ~Dispatcher() override;

    std::shared_ptr<DispatcherImpl> impl() const;
    std::shared_ptr<IDispatchable> popUiTask();
    void requestDispatch();

    mutable std::mutex m_implMutex; ///< guards the pointer only, so that cancel may replace it under running calls
    std::shared_ptr<DispatcherImpl> m_impl;
    std::mutex m_proxyMutex; ///< held through a cancel: no second worker may start beside the one that ends
    std::shared_ptr<IObdProxy> m_proxy;
    std::unique_ptr<DispatchQueue> m_uiQueue;
};

} // namespace obd
