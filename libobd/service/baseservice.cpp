#include "libobd/service/baseservice.h"

#include "libobd/dispatch/callback.h"

#include <obd/iconnectionmanager.h>
#include <obd/iconnectionnotifier.h>
#include <obd/iobdproxy.h>
#include <obd/iobdvelmora.h>
#include <obd/ivelmorasettings.h>

#include <utility>

namespace obd {

namespace {

// Reads a state into its copy, anew if an event brought a newer one meanwhile.
template <typename Read>
void settle(std::atomic<unsigned int> const& events, Read read)
{
    unsigned int before = 0;
    do {
        before = events;
        read();
    } while (events != before);
}

} // namespace

BaseService::BaseService(IObdVelmora const* obd, unsigned int priority, Following following)
    : m_obd(obd), m_priority(priority), m_openedCallback(std::make_shared<Callback>()),
      m_closedCallback(std::make_shared<Callback>()), m_spareCallback(std::make_shared<Callback>())
{
    if (following == Following::AtOnce) {
        follow();
    }
}

BaseService::~BaseService()
{
    unfollow();
}

void BaseService::startFollowing()
{
    follow();
}

void BaseService::stopFollowing()
{
    unfollow();
}

void BaseService::follow()
{
    try {
        m_obd->getConnectionNotifier()->attach(m_priority, this);
        m_obd->getEcuManager()->attach(this);
        m_obd->getSettings()->attach(this);
        readState();
    } catch (...) { // such as the application's settings store throws
        unfollow();
        throw;
    }
}

void BaseService::unfollow()
{
    m_obd->getSettings()->detach(this);
    m_obd->getEcuManager()->detach(this);
    m_obd->getConnectionNotifier()->detach(m_priority, this);
}

void BaseService::readState()
{
    settle(m_unitEvents, [this] { m_unitSystem = m_obd->getSettings()->unitSystem(); });
    std::shared_ptr<IConnectionManager> const manager = m_obd->getConnectionManager();
    settle(m_connectionEvents, [&] { m_connected = manager != nullptr && manager->getProxy()->isConnected(); });
    if (m_connected) {
        readEcu();
    }
}

// Under the lock from the reading on, lest the later of two readers leave an older module.
void BaseService::readEcu()
{
    std::shared_ptr<IEcu> before; // dies after the lock is given up
    std::lock_guard const lock(m_ecuMutex);
    before = std::exchange(m_ecu, m_obd->getEcuManager()->getCurrentEcu());
}

std::shared_ptr<IEcu> BaseService::ecu() const
{
    std::lock_guard const lock(m_ecuMutex);
    return m_ecu;
}

void BaseService::onConnectionOpened()
{
    ++m_connectionEvents;
    m_connected = true;
    m_openedCallback->post([this] { onServiceConnected(); });
}

void BaseService::onConnectionClosed()
{
    ++m_connectionEvents;
    m_connected = false;
    m_closedCallback->post([this] { onServiceDisconnected(); });
}

void BaseService::onEvent(EcuManagerEvent const& event)
{
    if (event != EcuManagerEvent::CurrentEcuChanged) {
        return;
    }
    readEcu();
    if (m_connected) {
        onEcuChanged();
    }
}

void BaseService::onEvent(VelmoraSettingsEvent const& event)
{
    if (event != VelmoraSettingsEvent::UnitSystemChanged) {
        return;
    }
    ++m_unitEvents;
    UnitSystem const system = m_obd->getSettings()->unitSystem();
    if (m_unitSystem.exchange(system) != system) {
        onUnitSystemChanged();
    }
}

} // namespace obd
