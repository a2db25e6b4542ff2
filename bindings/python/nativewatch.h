#pragma once

#include "bindings/python/threads.h"

#include <velmora/car.h>

#include <pybind11/pybind11.h>

#include <condition_variable>
#include <deque>
#include <memory>
#include <mutex>
#include <vector>

namespace velmora::python {

// Readings wait here for Python. Who is too slow loses the oldest ones, and is told how many.
class ReadingQueue
{
public:
    void push(Reading const& reading);
    void setLink(LinkState state);
    void close();

    // All that is there; waits so long for the first one. Nothing after close. Without Python's lock.
    std::vector<Reading> take(std::chrono::milliseconds limit);
    bool closed() const;
    bool linkIsUp() const;
    std::size_t lost() const;

private:
    mutable std::mutex m_mutex;
    std::condition_variable m_wake;
    std::deque<Reading> m_readings;
    std::size_t m_lost = 0;
    bool m_closed = false;
    bool m_up = true;
};

// A watch whose readings Python takes in batches, so that it never holds the car up.
class NativeWatch
{
public:
    NativeWatch(std::shared_ptr<Car> car, std::shared_ptr<ReadingQueue> queue, Watch watch);
    ~NativeWatch();
    NativeWatch(NativeWatch const&) = delete;
    NativeWatch& operator=(NativeWatch const&) = delete;

    // Readings as tuples, as soon as there are any; none after so many seconds, or once stopped. Lets Ctrl-C in.
    pybind11::list take(double seconds);
    bool linkIsUp() const { return m_queue->linkIsUp(); }
    bool stopped() const { return m_queue->closed(); }
    std::size_t lost() const { return m_queue->lost(); }
    void stop();

private:
    std::shared_ptr<Car> m_car; // stands for as long as it is watched
    std::shared_ptr<ReadingQueue> m_queue;
    Watch m_watch;
    ClosedAtExit m_atExit{[this] { stop(); }};
};

} // namespace velmora::python
