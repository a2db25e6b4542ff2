#include "libvelmora/session/deadline.h"

#include <chrono>
#include <utility>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds limit(500);

} // namespace

Deadline::Deadline(std::function<void()> onExpiry) : m_onExpiry(std::move(onExpiry)) {}

void Deadline::start()
{
    std::lock_guard const lock(m_mutex);
    if (!m_stopped && !m_thread.joinable()) {
        m_thread = std::thread([this] { wait(); });
    }
}

void Deadline::wait()
{
    std::unique_lock lock(m_mutex);
    if (!m_wake.wait_for(lock, limit, [this] { return m_stopped; })) {
        lock.unlock();
        m_onExpiry();
    }
}

void Deadline::stop()
{
    std::unique_lock lock(m_mutex);
    m_stopped = true;
    m_wake.notify_one();
    std::thread thread = std::move(m_thread);
    lock.unlock();
    if (thread.joinable()) {
        thread.join();
    }
}

} // namespace velmora
