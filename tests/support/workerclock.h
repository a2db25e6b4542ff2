#pragma once

#include "tests/support/gate.h"

#include <common/clock.h>

#include <chrono>
#include <condition_variable>
#include <map>
#include <mutex>
#include <thread>

namespace support {

// Time for tests with a worker thread: it stands still until the test moves it, however often the worker polls, and
// sleeping takes a twentieth of a millisecond. So nothing comes due by chance, and no poll keeps a core busy. (With a
// FakeClock the worker's polls would race through the hours.) In force for its lifetime; the worker must have ended
// before it goes.
class WorkerClock : public tervex::IClock
{
public:
    explicit WorkerClock(unsigned int startMs = 1000) : m_millis(startMs) { tervex::setClock(this); }
    ~WorkerClock() override { tervex::setClock(nullptr); }
    WorkerClock(WorkerClock const&) = delete;
    WorkerClock& operator=(WorkerClock const&) = delete;

    unsigned int millis() override
    {
        std::lock_guard const lock(m_mutex);
        return m_millis;
    }

    void sleep(unsigned int ms) override
    {
        {
            std::lock_guard const lock(m_mutex);
            ++m_sleeps;
            ++m_lengths[ms];
            m_changed.notify_all();
        }
        std::this_thread::sleep_for(std::chrono::microseconds(50));
    }

    std::time_t wallSeconds() override { return 1709802302; }

    void advance(unsigned int ms)
    {
        std::lock_guard const lock(m_mutex);
        m_millis += ms;
    }

    // Waits until the worker, having nothing to do, has been through a whole round of its loop. False if it doesn't.
    bool awaitIdleRound()
    {
        std::unique_lock lock(m_mutex);
        long const target = m_sleeps + 2;
        return m_changed.wait_for(lock, patience, [this, target] { return m_sleeps >= target; });
    }

    // Moves time on and lets the worker see it.
    bool advanceIdle(unsigned int ms)
    {
        advance(ms);
        return awaitIdleRound();
    }

    // How often a sleep of this length was asked for.
    int sleepsOf(unsigned int ms)
    {
        std::lock_guard const lock(m_mutex);
        return m_lengths[ms];
    }

private:
    std::mutex m_mutex;
    std::condition_variable m_changed;
    unsigned int m_millis;
    long m_sleeps = 0;
    std::map<unsigned int, int> m_lengths;
};

} // namespace support
