#pragma once

#include <chrono>
#include <condition_variable>
#include <functional>
#include <mutex>
#include <thread>

namespace velmora::cli {

// Does something on a thread of its own if an end takes too long.
class LastResort
{
public:
    LastResort() = default;
    // Calls it off, if it has not begun.
    ~LastResort()
    {
        {
            std::lock_guard const lock(m_mutex);
            m_done = true;
            m_wake.notify_all();
        }
        if (m_thread.joinable()) {
            m_thread.join();
        }
    }
    LastResort(LastResort const&) = delete;
    LastResort& operator=(LastResort const&) = delete;

    // Once.
    void arm(std::chrono::milliseconds limit, std::function<void()> act)
    {
        std::lock_guard const lock(m_mutex);
        if (!m_thread.joinable()) {
            m_thread = std::thread([this, limit, act = std::move(act)] {
                std::unique_lock wait(m_mutex);
                if (!m_wake.wait_for(wait, limit, [this] { return m_done; })) {
                    wait.unlock();
                    act();
                }
            });
        }
    }

private:
    std::mutex m_mutex;
    std::condition_variable m_wake;
    bool m_done = false; // protected by m_mutex
    std::thread m_thread;
};

} // namespace velmora::cli
