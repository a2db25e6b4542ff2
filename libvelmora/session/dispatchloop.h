#pragma once

#include <obd/dispatcher.h>
#include <tervex/observer.h>

#include <chrono>
#include <condition_variable>
#include <functional>
#include <mutex>

namespace velmora {

// The program's event loop: calls Dispatcher::dispatch on the main thread, once for each time it was asked to, since
// the dispatcher counts on that.
class DispatchLoop : public tervex::Observer<obd::IDispatchRunner>
{
public:
    DispatchLoop();
    ~DispatchLoop() override;
    DispatchLoop(DispatchLoop const&) = delete;
    DispatchLoop& operator=(DispatchLoop const&) = delete;

    // Any thread.
    void onDispatchRequested() override;
    // Called with every request to dispatch, on the thread that makes it, which it must not hold up. Null removes it;
    // once that has returned, it isn't running any more.
    void setListener(std::function<void()> listener);
    // Makes runUntil look at its condition. Any thread.
    void wake();

    // Dispatches until the condition holds, which is asked after every dispatch and wake. False if the time ran out
    // first. Main thread.
    bool runUntil(std::function<bool()> const& condition,
                  std::chrono::steady_clock::time_point limit = std::chrono::steady_clock::time_point::max());

private:
    std::mutex m_mutex;
    std::condition_variable m_wake;
    std::function<void()> m_listener; // protected by m_mutex
    unsigned int m_requests = 0;      // protected by m_mutex
    bool m_woken = false;             // protected by m_mutex
};

} // namespace velmora
