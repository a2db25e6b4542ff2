#pragma once

#include <atomic>
#include <functional>
#include <mutex>
#include <thread>

namespace velmora::cli {

// Ctrl-C and the wish to terminate. Made in main before any other thread: from then on the signals reach this object
// only. The first one asks the running command to end; the second ends the program at once.
class Interrupt
{
public:
    Interrupt();
    ~Interrupt();
    Interrupt(Interrupt const&) = delete;
    Interrupt& operator=(Interrupt const&) = delete;

    // The one of this process.
    static Interrupt& instance();

    bool raised() const { return m_raised; }

    // Called on the object's own thread when a signal comes; at once if one came already. Null removes it; once that
    // has returned, it isn't running any more.
    void setHandler(std::function<void()> handler);

    // While there is one, a hang-up calls it, on the object's own thread, and ends nothing. Null removes it; once that
    // has returned, it isn't running any more.
    void setHangUpHandler(std::function<void()> handler);

    // What has to be put right even when the second signal ends the program at once. Null removes it; once that has
    // returned, it isn't running any more.
    void setLastAct(std::function<void()> act);

private:
    void wait();
    bool hangUp();
    [[noreturn]] void endAtOnce();

    std::atomic<bool> m_raised{false};
    std::atomic<bool> m_stop{false};
    std::mutex m_mutex;
    std::function<void()> m_handler; // protected by m_mutex
    std::function<void()> m_hangUp;  // protected by m_mutex
    std::mutex m_lastActMutex;       // apart from the other: the handler may be what hangs
    std::function<void()> m_lastAct; // protected by m_lastActMutex
    std::thread m_thread;
};

} // namespace velmora::cli
