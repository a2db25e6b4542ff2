#include "bindings/python/threads.h"

#include <pybind11/stl.h>

#include <chrono>
#include <condition_variable>
#include <ctime>
#include <list>
#include <mutex>
#include <set>
#include <thread>

namespace py = pybind11;

namespace velmora::python {

namespace {

// Python makes a thread state for a foreign thread at each entry and frees it at each exit, which takes most of the
// time of a callback; this one stays for as long as the thread.
class StayingThreadState
{
public:
    StayingThreadState() : m_lock(PyGILState_Ensure()), m_state(PyEval_SaveThread()) {}
    ~StayingThreadState()
    {
        if (_Py_IsFinalizing() == 0) {
            PyEval_RestoreThread(m_state);
            PyGILState_Release(m_lock);
        }
    }
    StayingThreadState(StayingThreadState const&) = delete;
    StayingThreadState& operator=(StayingThreadState const&) = delete;

private:
    PyGILState_STATE m_lock;
    PyThreadState* m_state;
};

// A call that may outlive the wait for it.
struct Call
{
    std::mutex mutex;
    std::condition_variable wake;
    bool done = false;         // protected by mutex
    std::exception_ptr thrown; // protected by mutex
};

std::list<std::thread>& leftThreads()
{
    static std::list<std::thread> threads; // under Python's lock
    return threads;
}

std::set<ClosedAtExit*>& openOnes()
{
    static std::set<ClosedAtExit*> open; // under Python's lock
    return open;
}

bool inMainThread()
{
    py::object const threading = py::module_::import("threading");
    return threading.attr("current_thread")().is(threading.attr("main_thread")());
}

bool isDone(Call& call)
{
    using namespace std::chrono_literals;
    py::gil_scoped_release const free;
    std::unique_lock lock(call.mutex);
    return call.wake.wait_for(lock, 50ms, [&call] { return call.done; });
}

double threadSeconds()
{
    timespec time{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
    return static_cast<double>(time.tv_sec) + 1e-9 * static_cast<double>(time.tv_nsec);
}

} // namespace

Callback::Callback(py::function function)
    : m_function(new py::function(std::move(function)), [](py::function* dropped) {
          py::gil_scoped_acquire const hold;
          delete dropped;
      })
{}

template <typename Argument>
void Callback::call(Argument const& argument) const
{
    if (_Py_IsFinalizing() != 0) {
        return;
    }
    static thread_local StayingThreadState const stays;
    py::gil_scoped_acquire const hold;
    try {
        (*m_function)(argument());
    } catch (py::error_already_set& raised) {
        raised.discard_as_unraisable("a callback of velmora");
    }
}

void Callback::operator()(Reading const& reading) const
{
    call([&reading] { return plain(reading); });
}

void Callback::operator()(std::string const& text) const
{
    call([&text] {
        return py::reinterpret_steal<py::str>(
            PyUnicode_DecodeUTF8(text.data(), static_cast<py::ssize_t>(text.size()), "replace"));
    });
}

void runInterruptibly(std::function<void()> function)
{
    if (!inMainThread()) {
        py::gil_scoped_release const free;
        function();
        return;
    }
    auto const call = std::make_shared<Call>();
    std::thread thread([call, function = std::move(function)]() mutable {
        std::exception_ptr thrown;
        try {
            function();
        } catch (...) {
            thrown = std::current_exception();
        }
        function = nullptr; // what it owns goes before anybody is told
        std::lock_guard const lock(call->mutex);
        call->thrown = thrown;
        call->done = true;
        call->wake.notify_all();
    });
    while (!isDone(*call)) {
        if (PyErr_CheckSignals() != 0) {
            leftThreads().push_back(std::move(thread));
            throw py::error_already_set();
        }
    }
    {
        py::gil_scoped_release const free;
        thread.join();
    }
    if (call->thrown) {
        std::rethrow_exception(call->thrown);
    }
}

ClosedAtExit::ClosedAtExit(std::function<void()> close) : m_close(std::move(close))
{
    openOnes().insert(this);
}

ClosedAtExit::~ClosedAtExit()
{
    openOnes().erase(this);
}

void finishThreads()
{
    while (!openOnes().empty()) {
        ClosedAtExit* const one = *openOnes().begin();
        openOnes().erase(one);
        auto const close = one->m_close; // what it belongs to may be dropped by another thread meanwhile
        close();
    }
    std::list<std::thread> threads = std::move(leftThreads());
    leftThreads().clear();
    py::gil_scoped_release const free;
    for (std::thread& thread : threads) {
        thread.join();
    }
}

double callbackSeconds(py::function const& function, unsigned int count)
{
    Callback const callback(function);
    double seconds = 0;
    py::gil_scoped_release const free;
    std::thread([&] {
        Reading reading;
        reading.sensor = "RPM";
        reading.value = 1726.0;
        callback(reading); // the first call makes the thread state
        double const begin = threadSeconds();
        for (unsigned int each = 0; each < count; ++each) {
            callback(reading);
        }
        seconds = threadSeconds() - begin;
    }).join();
    return seconds;
}

} // namespace velmora::python
