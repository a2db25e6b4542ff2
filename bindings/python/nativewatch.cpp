#include "bindings/python/nativewatch.h"

#include <algorithm>
#include <chrono>

namespace py = pybind11;

namespace velmora::python {

namespace {

constexpr std::size_t queueLimit = 65536;

} // namespace

void ReadingQueue::push(Reading const& reading)
{
    std::lock_guard const lock(m_mutex);
    if (m_readings.size() == queueLimit) {
        m_readings.pop_front();
        ++m_lost;
    }
    m_readings.push_back(reading);
    m_wake.notify_one();
}

void ReadingQueue::setLink(LinkState state)
{
    std::lock_guard const lock(m_mutex);
    m_up = state == LinkState::Returned;
}

void ReadingQueue::close()
{
    std::lock_guard const lock(m_mutex);
    m_closed = true;
    m_wake.notify_all();
}

std::vector<Reading> ReadingQueue::take(std::chrono::milliseconds limit)
{
    std::unique_lock lock(m_mutex);
    m_wake.wait_for(lock, limit, [this] { return m_closed || !m_readings.empty(); });
    std::vector<Reading> taken(std::make_move_iterator(m_readings.begin()), std::make_move_iterator(m_readings.end()));
    m_readings.clear();
    return taken;
}

bool ReadingQueue::closed() const
{
    std::lock_guard const lock(m_mutex);
    return m_closed;
}

bool ReadingQueue::linkIsUp() const
{
    std::lock_guard const lock(m_mutex);
    return m_up;
}

std::size_t ReadingQueue::lost() const
{
    std::lock_guard const lock(m_mutex);
    return m_lost;
}

NativeWatch::NativeWatch(std::shared_ptr<Car> car, std::shared_ptr<ReadingQueue> queue, Watch watch)
    : m_car(std::move(car)), m_queue(std::move(queue)), m_watch(std::move(watch))
{}

NativeWatch::~NativeWatch()
{
    stop();
}

py::list NativeWatch::take(double seconds)
{
    using namespace std::chrono_literals;
    auto const end = std::chrono::steady_clock::now() +
                     std::chrono::milliseconds(static_cast<long long>(std::clamp(seconds, 0.0, 1e6) * 1000));
    auto const queue = m_queue;
    while (true) {
        std::vector<Reading> taken;
        auto const left = std::chrono::duration_cast<std::chrono::milliseconds>(end - std::chrono::steady_clock::now());
        {
            py::gil_scoped_release const free;
            taken = queue->take(std::clamp(left, 0ms, 50ms));
        }
        if (PyErr_CheckSignals() != 0) {
            throw py::error_already_set();
        }
        if (!taken.empty() || left <= 0ms || queue->closed()) {
            py::list list;
            for (Reading const& reading : taken) {
                list.append(plain(reading));
            }
            return list;
        }
    }
}

// Ends the watch without Python's lock, which a callback that runs may be waiting for.
void NativeWatch::stop()
{
    m_queue->close();
    Watch watch = std::move(m_watch);
    std::shared_ptr<Car> car = std::move(m_car);
    py::gil_scoped_release const free;
    watch.end();
    car.reset();
}

} // namespace velmora::python
