#pragma once

#include <common/logrecord.h>
#include <tervex/ieventproducer.h>

#include <mutex>
#include <shared_mutex>
#include <vector>

namespace tervex {

// The listener list behind an IEventProducer. May fire from several threads at once.
template <typename E, typename L = IEventListener<E>>
class EventProducer : public virtual IEventProducer<E, L>
{
public:
    void attach(L* listener) override
    {
        std::unique_lock const lock(m_mutex);
        m_listeners.push_back(listener);
    }

    void detach(L* listener) override
    {
        std::unique_lock const lock(m_mutex);
        std::erase(m_listeners, listener);
    }

protected:
    // Tells all listeners in the order of their attachment. A listener that throws ends the walk with a log line; the
    // ones behind it do not hear this event, and nothing reaches the caller.
    void fire(E const& event)
    {
        std::shared_lock const lock(m_mutex);
        try {
            for (L* listener : m_listeners) {
                listener->onEvent(event);
            }
        } catch (...) {
            TERVEX_LOG(Fatal) << "Listener threw an exception";
        }
    }

private:
    std::shared_mutex m_mutex;
    std::vector<L*> m_listeners; // not owned; protected by m_mutex
};

} // namespace tervex
