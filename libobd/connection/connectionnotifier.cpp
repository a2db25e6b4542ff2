#include "libobd/connection/connectionnotifier.h"

#include <obd/iconnectionnotifier.h>

namespace obd {

void ConnectionNotifier::attach(unsigned int priority, IConnectionNotifierListener* listener)
{
    if (priority < m_lists.size()) {
        std::lock_guard const lock(m_lists[priority].mutex);
        m_lists[priority].listeners.push_back(listener);
    }
}

void ConnectionNotifier::detach(unsigned int priority, IConnectionNotifierListener* listener)
{
    if (priority < m_lists.size()) {
        std::lock_guard const lock(m_lists[priority].mutex);
        std::erase(m_lists[priority].listeners, listener);
    }
}

void ConnectionNotifier::onPhaseChanged(int phase)
{
    int const before = m_phase.exchange(phase);
    if (phase == Connected) {
        tellAll(&IConnectionNotifierListener::onConnectionOpened);
    } else if (phase == Closed && before == Connected) {
        tellAll(&IConnectionNotifierListener::onConnectionClosed);
    }
}

void ConnectionNotifier::tellAll(void (IConnectionNotifierListener::*what)())
{
    for (List& list : m_lists) {
        std::lock_guard const lock(list.mutex);
        // NOLINTNEXTLINE(modernize-loop-convert): reads the size afresh at each step
        for (std::size_t i = 0; i < list.listeners.size(); ++i) {
            (list.listeners[i]->*what)();
        }
    }
}

} // namespace obd
