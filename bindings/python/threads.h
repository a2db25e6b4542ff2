#pragma once

#include <velmora/reading.h>

#include <pybind11/pybind11.h>

#include <exception>
#include <functional>
#include <memory>

// How Python's one lock, its signals and the library's threads get along.

namespace velmora::python {

// A Python callable for threads of the library: taken, called and dropped under Python's lock only. What it raises goes
// to sys.unraisablehook, for nobody waits there who could be told.
class Callback
{
public:
    explicit Callback(pybind11::function function);

    void operator()(Reading const& reading) const;
    void operator()(std::string const& text) const;

private:
    template <typename Argument>
    void call(Argument const& argument) const;

    std::shared_ptr<pybind11::function> m_function;
};

// Runs a function without Python's lock, and lets Ctrl-C end the wait: the function is then left to end by itself, on
// a thread that the interpreter waits for when it exits. So it must own all that it uses.
void runInterruptibly(std::function<void()> function);

// The same for a function that gives something.
template <typename Function>
auto interruptibly(Function function) -> std::invoke_result_t<Function&>
{
    auto const result = std::make_shared<std::unique_ptr<std::invoke_result_t<Function&>>>();
    runInterruptibly([result, function = std::move(function)]() mutable {
        *result = std::make_unique<std::invoke_result_t<Function&>>(function());
    });
    return std::move(**result);
}

// Closes what is still open when Python exits, before the interpreter goes that the library's threads call into. Made,
// dropped and run under Python's lock.
class ClosedAtExit
{
public:
    explicit ClosedAtExit(std::function<void()> close);
    ~ClosedAtExit();
    ClosedAtExit(ClosedAtExit const&) = delete;
    ClosedAtExit& operator=(ClosedAtExit const&) = delete;

private:
    friend void finishThreads();

    std::function<void()> m_close;
};

// Ends the library's threads: of what is still open, and those that interrupted calls have left behind. With Python's
// lock, which it lets go.
void finishThreads();

// Processor seconds that a thread of the library takes for so many calls of a callable: what a callback costs.
double callbackSeconds(pybind11::function const& function, unsigned int count);

// A reading as the tuple that the Python part makes its object of.
pybind11::tuple plain(Reading const& reading);

} // namespace velmora::python
