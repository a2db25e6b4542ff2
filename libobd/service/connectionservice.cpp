#include "libobd/service/connectionservice.h"

#include "libobd/service/builtservice.h"

#include <obd/iconnectionmanager.h>
#include <obd/idevice.h>
#include <obd/iecu.h>
#include <obd/iobdvelmora.h>
#include <obd/ivelmorasettings.h>

#include <mutex>

namespace obd {

namespace {

constexpr unsigned int lastPriority = 2;

} // namespace

ConnectionService::ConnectionService(IObdVelmora const* obd, Following following)
    : BaseService(obd, lastPriority, following)
{}

std::string ConnectionService::standardDescription() const
{
    std::shared_ptr<IEcu> const current = ecu();
    return current != nullptr ? current->standardDescription() : std::string();
}

IConnectionOptions* ConnectionService::connectionOptions() const
{
    return obd()->getSettings()->connectionOptions();
}

std::shared_ptr<IAdapter> ConnectionService::adapter() const
{
    return obd()->getConnectionManager()->getAdapter();
}

void ConnectionService::onServiceConnected()
{
    notify(&IConnectionServiceObserver::onConnectionOpened);
}

void ConnectionService::onServiceDisconnected()
{
    notify(&IConnectionServiceObserver::onConnectionClosed);
}

void ConnectionService::onEcuChanged()
{
    notify(&IConnectionServiceObserver::onActiveEcuChanged);
}

std::shared_ptr<IConnectionService> ConnectionServiceBuilder::createConnectionService()
{
    static std::mutex mutex;
    static std::weak_ptr<IConnectionService> latest;
    std::lock_guard const lock(mutex);
    std::shared_ptr<IConnectionService> service = latest.lock();
    if (service == nullptr) {
        service = buildService<ConnectionService>();
        latest = service;
    }
    return service;
}

} // namespace obd
