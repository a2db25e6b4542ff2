#pragma once

#include <common/logrecord.h>
#include <tervex/ieventproducer.h>

#include <algorithm>
#include <condition_variable>
#include <cstddef>
#include <mutex>
#include <thread>
#include <vector>

namespace tervex {

// The listener list behind an IEventProducer. May fire from several threads at once. No lock is held over a call, so
// that a listener may attach and detach, itself and others, and fire again.
template <typename E, typename L = IEventListener<E>>
class EventProducer : public virtual IEventProducer<E, L>
{
public:
    // An event that is being told does not reach the new listener any more.
    void attach(L* listener) override
    {
        std::lock_guard const lock(m_mutex);
        m_listeners.push_back(listener);
    }

    // Waits for the calls of the listener that other threads are at; a call on this thread goes on, and is the last.
    void detach(L* listener) override
    {
        std::unique_lock lock(m_mutex);
        std::replace(m_listeners.begin(), m_listeners.end(), listener, static_cast<L*>(nullptr));
        dropGaps();
        m_callEnded.wait(lock, [this, listener] { return !isCalledElsewhere(listener); });
    }

protected:
    // Tells all listeners in the order of their attachment. A listener that throws ends the walk with a log line; the
    // ones behind it do not hear this event, and nothing reaches the caller.
    void fire(E const& event)
    {
        std::unique_lock lock(m_mutex);
        ++m_walks;
        std::size_t const count = m_listeners.size();
        bool goOn = true;
        for (std::size_t i = 0; goOn && i < count; ++i) {
            if (L* const listener = m_listeners[i]) {
                goOn = call(*listener, event, lock);
            }
        }
        --m_walks;
        dropGaps();
    }

private:
    struct Call
    {
        L const* listener;
        std::thread::id thread;
    };

    // False if the listener threw. It may be gone when its call ends.
    bool call(L& listener, E const& event, std::unique_lock<std::mutex>& lock)
    {
        Call const mine{&listener, std::this_thread::get_id()};
        m_calls.push_back(mine);
        lock.unlock();
        bool returned = true;
        try {
            listener.onEvent(event);
        } catch (...) {
            TERVEX_LOG(Fatal) << "Listener threw an exception";
            returned = false;
        }
        lock.lock();
        auto const isMine = [&mine](Call const& other) {
            return other.listener == mine.listener && other.thread == mine.thread;
        };
        m_calls.erase(std::find_if(m_calls.begin(), m_calls.end(), isMine));
        m_callEnded.notify_all();
        return returned;
    }

    bool isCalledElsewhere(L const* listener) const
    {
        return std::any_of(m_calls.begin(), m_calls.end(), [listener](Call const& call) {
            return call.listener == listener && call.thread != std::this_thread::get_id();
        });
    }

    // Walks go by index, so the list is closed up only between them.
    void dropGaps()
    {
        if (m_walks == 0) {
            std::erase(m_listeners, nullptr);
        }
    }

    std::mutex m_mutex; // a leaf
    std::condition_variable m_callEnded;
    std::vector<L*> m_listeners; // not owned; null where one was detached during a walk; protected by m_mutex
    std::vector<Call> m_calls;   // under way; protected by m_mutex
    int m_walks = 0;             // protected by m_mutex
};

} // namespace tervex
