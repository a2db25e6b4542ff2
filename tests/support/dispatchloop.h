#pragma once

#include "tests/support/gate.h"

#include <obd/dispatcher.h>
#include <tervex/observer.h>

#include <chrono>
#include <condition_variable>
#include <functional>
#include <mutex>

namespace support {

// The application's side of the Dispatcher: counts its requests, and dispatches on the thread of the test, once for
// each request. Attached for its lifetime.
class DispatchLoop : public tervex::Observer<obd::IDispatchRunner>
{
public:
    DispatchLoop() { obd::Dispatcher::getInstance().attach(this); }
    ~DispatchLoop() override { obd::Dispatcher::getInstance().detach(this); }
    DispatchLoop(DispatchLoop const&) = delete;
    DispatchLoop& operator=(DispatchLoop const&) = delete;

    void onDispatchRequested() override
    {
        std::lock_guard const lock(m_mutex);
        ++m_requested;
        m_changed.notify_all();
    }

    // All requests so far.
    int requested() const
    {
        std::lock_guard const lock(m_mutex);
        return m_requested;
    }

    // Waits until that many requests have come, without dispatching. False if they don't.
    bool awaitRequested(int count)
    {
        std::unique_lock lock(m_mutex);
        return m_changed.wait_for(lock, patience, [this, count] { return m_requested >= count; });
    }

    // Waits until every request so far has been dispatched, by the thread of the test. False if that takes too long.
    bool awaitCaughtUp()
    {
        std::unique_lock lock(m_mutex);
        return m_changed.wait_for(lock, patience, [this] { return m_done >= m_requested; });
    }

    // Dispatches once for each request that is open.
    void runPending()
    {
        while (takeRequest(std::chrono::milliseconds(0))) {
            dispatch();
        }
    }

    // Dispatches as requests come in, until done says so. False if it never does.
    bool runUntil(std::function<bool()> const& done)
    {
        auto const end = std::chrono::steady_clock::now() + patience;
        while (!done()) {
            if (std::chrono::steady_clock::now() > end) {
                return false;
            }
            if (takeRequest(std::chrono::milliseconds(1))) {
                dispatch();
            }
        }
        return true;
    }

private:
    bool takeRequest(std::chrono::milliseconds wait)
    {
        std::unique_lock lock(m_mutex);
        if (!m_changed.wait_for(lock, wait, [this] { return m_requested > m_dispatched; })) {
            return false;
        }
        ++m_dispatched;
        return true;
    }

    void dispatch()
    {
        obd::Dispatcher::getInstance().dispatch();
        std::lock_guard const lock(m_mutex);
        ++m_done;
        m_changed.notify_all();
    }

    mutable std::mutex m_mutex;
    std::condition_variable m_changed;
    int m_requested = 0;
    int m_dispatched = 0;
    int m_done = 0;
};

} // namespace support
