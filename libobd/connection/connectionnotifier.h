#pragma once

#include <obd/iconnectionmanager.h>
#include <obd/iconnectionnotifier.h>

#include <array>
#include <atomic>
#include <mutex>
#include <vector>

namespace obd {

// Turns the phases of the connection manager into opened and closed, by priority.
class ConnectionNotifier : public IConnectionNotifier, public IConnectionPhaseListener
{
public:
    bool isConnected() override { return m_phase == Connected; }
    void attach(unsigned int priority, IConnectionNotifierListener* listener) override;
    void detach(unsigned int priority, IConnectionNotifierListener* listener) override;

    // Opened on reaching Connected, closed on Closed if the phase before was Connected; other changes tell nobody.
    void onPhaseChanged(int phase) override;

private:
    struct List
    {
        std::mutex mutex;
        std::vector<IConnectionNotifierListener*> listeners; // not owned
    };

    void tellAll(void (IConnectionNotifierListener::*what)());

    std::array<List, 3> m_lists; // by priority
    std::atomic<int> m_phase{Closed};
};

} // namespace obd
