#pragma once

#include <chrono>
#include <condition_variable>
#include <mutex>

namespace support {

// How long a test waits for another thread before it takes it for hung.
inline constexpr std::chrono::seconds patience{20};

// A place where threads wait for each other: one passes through, another opens.
class Gate
{
public:
    explicit Gate(bool open = false) : m_open(open) {}

    // Waits here while the gate is shut. Gives up on a test that forgets to open it.
    void pass()
    {
        std::unique_lock lock(m_mutex);
        ++m_waiting;
        m_changed.notify_all();
        m_changed.wait_for(lock, patience, [this] { return m_open; });
        --m_waiting;
    }

    // Waits until threads stand before the gate. False if they don't come.
    bool awaitWaiting(int threads = 1)
    {
        std::unique_lock lock(m_mutex);
        return m_changed.wait_for(lock, patience, [this, threads] { return m_waiting >= threads; });
    }

    void open() { set(true); }
    void shut() { set(false); }

private:
    void set(bool open)
    {
        std::lock_guard const lock(m_mutex);
        m_open = open;
        m_changed.notify_all();
    }

    std::mutex m_mutex;
    std::condition_variable m_changed;
    bool m_open;
    int m_waiting = 0;
};

} // namespace support
