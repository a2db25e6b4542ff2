#pragma once

#include "libobd/dispatch/dispatchqueue.h"

#include <common/cthread.h>

#include <atomic>
#include <memory>
#include <mutex>

namespace obd {

class IDispatchable;
class IObdProxy;

// Hears from the worker, on its thread.
class DispatcherTaskObserver
{
public:
    virtual ~DispatcherTaskObserver() = default;

    // The execute of some work is done; it waits for its finish.
    virtual void onTaskCompleted() = 0;
    // Nothing is queued. Again and again while that lasts.
    virtual void onIdle() = 0;
    // The worker begins, before its first look at the queue.
    virtual void onTaskStarted() = 0;
};

// The worker thread with its queues. Starts with the first work and ends with stop(), for good.
class DispatcherTask
{
public:
    // The observer must outlive the worker.
    explicit DispatcherTask(DispatcherTaskObserver* observer);
    ~DispatcherTask();

    DispatcherTask(DispatcherTask const&) = delete;
    DispatcherTask& operator=(DispatcherTask const&) = delete;

    void setProxy(std::shared_ptr<IObdProxy> const& proxy);

    // See Dispatcher::update. Any thread.
    bool update(std::weak_ptr<IDispatchable> const& work);

    // Work whose execute is done and whose finish hasn't run.
    DispatchQueue& completed() { return m_completed; }

    // Takes no more work, waits for that which the worker is at, and drops the rest. Any thread but the worker.
    void stop();

private:
    bool start();
    std::shared_ptr<IObdProxy> proxy() const;
    void updateTask();
    void run(std::weak_ptr<IDispatchable> const& entry);
    void execute(IDispatchable& work);

    DispatcherTaskObserver* m_observer;
    // One update at a time looks whether the worker runs, starts it and queues its work: one that came in between
    // would leave its work without a worker, to be run on the next connection.
    std::mutex m_startMutex;
    DispatchQueue m_pending;
    DispatchQueue m_completed;
    mutable std::mutex m_proxyMutex;
    std::shared_ptr<IObdProxy> m_proxy; // protected by m_proxyMutex
    bool m_started = false;             // protected by m_startMutex
    tervex::CThread m_thread{"DispatcherTask"};
    std::atomic<bool> m_stop{false};
};

} // namespace obd
