#include "libvelmora/session/dispatchloop.h"

#include <obd/dispatcher.h>

#include <utility>

namespace velmora {

DispatchLoop::DispatchLoop()
{
    obd::Dispatcher::getInstance().attach(this);
}

DispatchLoop::~DispatchLoop()
{
    obd::Dispatcher::getInstance().detach(this);
}

void DispatchLoop::onDispatchRequested()
{
    std::lock_guard const lock(m_mutex);
    ++m_requests;
    m_wake.notify_one();
    if (m_listener) {
        m_listener();
    }
}

void DispatchLoop::setListener(std::function<void()> listener)
{
    std::lock_guard const lock(m_mutex);
    m_listener = std::move(listener);
}

void DispatchLoop::wake()
{
    {
        std::lock_guard const lock(m_mutex);
        m_woken = true;
    }
    m_wake.notify_one(); // with the mutex free, so that who waits is not woken to wait for it
}

bool DispatchLoop::runUntil(std::function<bool()> const& condition, std::chrono::steady_clock::time_point limit)
{
    while (!condition()) {
        std::unique_lock lock(m_mutex);
        auto const called = [this] { return m_requests > 0 || m_woken; };
        if (limit == std::chrono::steady_clock::time_point::max()) {
            m_wake.wait(lock, called);
        } else if (!m_wake.wait_until(lock, limit, called)) {
            return false;
        }
        m_woken = false;
        unsigned int const requests = std::exchange(m_requests, 0);
        lock.unlock();
        for (unsigned int i = 0; i < requests; ++i) {
            obd::Dispatcher::getInstance().dispatch();
        }
    }
    return true;
}

} // namespace velmora
