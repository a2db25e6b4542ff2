#pragma once

#include <functional>
#include <memory>
#include <thread>

namespace tervex {

// A named thread handle. One thread at a time; the owner joins it.
class CThread
{
public:
    // No thread yet. The name is not copied and must outlive the handle.
    explicit CThread(char const* name);
    // A thread that is still joinable is told in the log and joined, so that a forgotten join does no harm.
    ~CThread();

    CThread(CThread const&) = delete;
    CThread& operator=(CThread const&) = delete;

    // Runs function(argument) on a new thread. False, with a log line, if the system gives no thread; false also while
    // an earlier thread has not been joined.
    template <typename Function, typename Argument>
    bool start(Function function, Argument argument)
    {
        return startThread([function, argument] { function(argument); });
    }

    // Waits for the thread, if there is one. A failing join is told in the log.
    void join();

private:
    bool startThread(std::function<void()> body);
    bool joinable() const { return m_thread != nullptr && m_thread->joinable(); }

    std::unique_ptr<std::thread> m_thread;
    char const* m_name;
};

} // namespace tervex
