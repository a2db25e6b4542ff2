#pragma once

namespace obd {

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

} // namespace obd
