#pragma once

#include <chrono>
#include <condition_variable>
#include <mutex>

namespace velmora {

// Whose turn it is: a mutex that can be waited for a while. Made of a condition, since ThreadSanitizer does not see how
// std::timed_mutex waits for a time.
class Turn
{
public:
    void lock()
    {
        std::unique_lock guard(m_mutex);
        m_free.wait(guard, [this] { return !m_taken; });
        m_taken = true;
    }

    template <typename Rep, typename Period>
    bool try_lock_for(std::chrono::duration<Rep, Period> const& limit)
    {
        std::unique_lock guard(m_mutex);
        if (!m_free.wait_for(guard, limit, [this] { return !m_taken; })) {
            return false;
        }
        m_taken = true;
        return true;
    }

    void unlock()
    {
        std::lock_guard const guard(m_mutex);
        m_taken = false;
        m_free.notify_one();
    }

private:
    std::mutex m_mutex;
    std::condition_variable m_free;
    bool m_taken = false; // protected by m_mutex
};

} // namespace velmora
