#pragma once

#include <condition_variable>
#include <functional>
#include <mutex>
#include <thread>

namespace velmora {

// Calls a function half a second after start, unless it is stopped before.
class Deadline
{
public:
    explicit Deadline(std::function<void()> onExpiry);
    ~Deadline() { stop(); }
    Deadline(Deadline const&) = delete;
    Deadline& operator=(Deadline const&) = delete;

    // Any thread; once it runs, further starts change nothing.
    void start();
    // Afterwards the function isn't running, and won't any more.
    void stop();

private:
    void wait();

    std::function<void()> m_onExpiry;
    std::mutex m_mutex;
    std::condition_variable m_wake;
    bool m_stopped = false; // protected by m_mutex
    std::thread m_thread;   // protected by m_mutex
};

} // namespace velmora
