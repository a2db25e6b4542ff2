#include "libobd/service/baseservice.h"

#include "libobd/dispatch/callback.h"

#include <obd/iconnectionmanager.h>
#include <obd/iconnectionnotifier.h>
#include <obd/iobdproxy.h>
#include <obd/iobdvelmora.h>
#include <obd/ivelmorasettings.h>

namespace obd {

BaseService::BaseService(IObdVelmora const* obd, unsigned int priority)
    : m_obd(obd), m_priority(priority), m_openedCallback(std::make_shared<Callback>()),
      m_closedCallback(std::make_shared<Callback>()), m_spareCallback(std::make_shared<Callback>())
{
    try {
        attachToAll();
        readState();
    } catch (...) { // such as the application's settings store throws
        detachFromAll();
        throw;
    }
}

BaseService::~BaseService()
{
    detachFromAll();
}

void BaseService::attachToAll()
{
    m_obd->getConnectionNotifier()->attach(m_priority, this);
    m_obd->getEcuManager()->attach(this);
    m_obd->getSettings()->attach(this);
}

void BaseService::detachFromAll()
{
    m_obd->getSettings()->detach(this);
    m_obd->getEcuManager()->detach(this);
    m_obd->getConnectionNotifier()->detach(m_priority, this);
}

void BaseService::readState()
{
    m_unitSystem = m_obd->getSettings()->unitSystem();
    std::shared_ptr<IConnectionManager> const manager = m_obd->getConnectionManager();
    m_connected = manager != nullptr && manager->getProxy()->isConnected();
    if (m_connected) {
        std::lock_guard const lock(m_ecuMutex);
        m_ecu = m_obd->getEcuManager()->getCurrentEcu();
    }
}

std::shared_ptr<IEcu> BaseService::ecu() const
{
    std::lock_guard const lock(m_ecuMutex);
    return m_ecu;
}

void BaseService::onConnectionOpened()
{
    m_connected = true;
    m_openedCallback->post([this] { onServiceConnected(); });
}

void BaseService::onConnectionClosed()
{
    m_connected = false;
    m_closedCallback->post([this] { onServiceDisconnected(); });
}

void BaseService::onEvent(EcuManagerEvent const& event)
{
    if (event != EcuManagerEvent::CurrentEcuChanged) {
        return;
    }
    std::shared_ptr<IEcu> current = m_obd->getEcuManager()->getCurrentEcu();
    {
        std::lock_guard const lock(m_ecuMutex);
        m_ecu.swap(current);
    }
    if (m_connected) {
        onEcuChanged();
    }
}

void BaseService::onEvent(VelmoraSettingsEvent const& event)
{
    if (event != VelmoraSettingsEvent::UnitSystemChanged) {
        return;
    }
    UnitSystem const system = m_obd->getSettings()->unitSystem();
    if (m_unitSystem.exchange(system) != system) {
        onUnitSystemChanged();
    }
}

} // namespace obd
