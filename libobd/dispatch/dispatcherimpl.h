#pragma once

#include "libobd/dispatch/dispatchertask.h"

#include <obd/dispatcher.h>

#include <atomic>
#include <memory>

namespace obd {

class KeepAliveDispatchable;

// What a cancel replaces: the worker with its queues, and the keep-alive. Whoever was using the old one when it was
// replaced still holds it, stopped.
class Dispatcher::DispatcherImpl : public DispatcherTaskObserver
{
public:
    explicit DispatcherImpl(Dispatcher& dispatcher);
    ~DispatcherImpl() override;

    void setProxy(std::shared_ptr<IObdProxy> const& proxy) { m_task.setProxy(proxy); }
    bool update(std::weak_ptr<IDispatchable> const& work) { return m_task.update(work); }

    // See DispatcherTask::stop.
    void stop();

    // The main thread's share.
    void queueKeepAliveIfDue();
    void finishCompleted();

    void onTaskStarted() override;
    void onTaskCompleted() override;
    void onIdle() override;

private:
    void requestDispatch();

    Dispatcher& m_dispatcher;
    DispatcherTask m_task;
    unsigned int m_lastActivity = 0; // the worker's alone
    std::atomic<bool> m_keepAliveDue{false};
    std::shared_ptr<KeepAliveDispatchable> m_keepAlive;
};

} // namespace obd
