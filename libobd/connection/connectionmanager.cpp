#include "libobd/connection/connectionmanager.h"

#include "libobd/adapter/elmscantool.h"
#include "libobd/module/obdproxy.h"

#include <common/clock.h>
#include <common/logrecord.h>
#include <obd/dispatcher.h>
#include <obd/iconnectionmanager.h>
#include <obd/idataconnection.h>

#include <algorithm>
#include <utility>

namespace obd {

namespace {

// Gives listeners that hand work to another thread a moment before the next step.
constexpr unsigned int phasePauseMs = 10;

template <typename T>
void removeFirst(std::vector<T*>& list, T* entry)
{
    auto const found = std::find(list.begin(), list.end(), entry);
    if (found != list.end()) {
        list.erase(found);
    }
}

} // namespace

ConnectionManager::ConnectionManager() : m_proxy(ObdProxyBuilder::createObdProxy())
{
    Dispatcher::getInstance().setProxy(m_proxy);
}

ConnectionManager::~ConnectionManager()
{
    // Proxy and control modules hold each other; with the manager the last one who uses them is gone.
    if (auto* const proxy = dynamic_cast<ObdProxy*>(m_proxy.get())) {
        proxy->releaseEcus();
    }
}

void ConnectionManager::addPhaseListener(IConnectionPhaseListener* listener)
{
    std::lock_guard const lock(m_listenerMutex);
    m_phaseListeners.push_back(listener);
}

void ConnectionManager::removePhaseListener(IConnectionPhaseListener* listener)
{
    std::lock_guard const lock(m_listenerMutex);
    removeFirst(m_phaseListeners, listener);
}

bool ConnectionManager::openConnection(std::shared_ptr<IDataConnection> const& connection, VehicleProtocol protocol,
                                       bool restoreAdapter)
{
    TERVEX_LOG(Info) << "openConnection enter";
    std::lock_guard const lock(m_connectionMutex);
    TERVEX_LOG(Info) << "-got lock (open)";
    bool const result = open(connection, protocol, restoreAdapter);
    TERVEX_LOG(Info) << "openConnection exit:" << (result ? "success" : "failure");
    return result;
}

bool ConnectionManager::open(std::shared_ptr<IDataConnection> const& connection, VehicleProtocol protocol,
                             bool restoreAdapter)
{
    if (connection == nullptr) {
        TERVEX_LOG(Fatal) << "No connection set";
        return false;
    }
    attachLoggers(connection);
    auto const device = std::make_shared<ElmScantool>(connection);
    if (restoreAdapter) {
        device->restoreDefaults();
        device->resetInterface();
    }
    if (!device->initialize()) {
        TERVEX_LOG(Fatal) << "Failed to init device";
        return false;
    }
    storeDevice(device);
    notifyPhase(DeviceReady);
    if (!device->detectVehicle(protocol)) {
        TERVEX_LOG(Fatal) << "Failed to detect vehicle/working protocol";
        return false;
    }
    m_proxy->setDevice(device);
    if (!m_proxy->initialize()) {
        TERVEX_LOG(Fatal) << "Failed to initialize proxy";
        return false;
    }
    storeConnection(connection);
    notifyPhase(Connected);
    return true;
}

bool ConnectionManager::isBusy()
{
    return openChannel() != nullptr;
}

void ConnectionManager::closeConnection()
{
    TERVEX_LOG(Info) << "closeConnection enter";
    std::lock_guard const lock(m_connectionMutex);
    TERVEX_LOG(Info) << "-got lock (close)";
    if (std::shared_ptr<IDevice> const device = getAdapter()) {
        device->close();
    }
    notifyPhase(Closed);
    m_proxy->setDevice(nullptr);
    storeDevice(nullptr);
    storeConnection(nullptr);
    forgetAttempted();
    Dispatcher::getInstance().cancel();
    TERVEX_LOG(Info) << "closeConnection exit";
}

std::shared_ptr<IDevice> ConnectionManager::getAdapter()
{
    std::lock_guard const lock(m_stateMutex);
    return m_device;
}

void ConnectionManager::storeDevice(std::shared_ptr<IDevice> device)
{
    std::lock_guard const lock(m_stateMutex);
    m_device.swap(device);
}

void ConnectionManager::storeConnection(std::shared_ptr<IDataConnection> connection)
{
    std::lock_guard const lock(m_stateMutex);
    m_connection.swap(connection);
}

void ConnectionManager::attachLoggers(std::shared_ptr<IDataConnection> const& connection)
{
    std::lock_guard const lock(m_loggerMutex);
    m_attempted = connection;
    if (!rememberTapped(connection)) {
        // It bears the loggers of an earlier attempt: each of them is to hear its traffic once.
        for (IConnectionLogger* logger : m_loggers) {
            connection->removeLogger(logger);
        }
    }
    for (IConnectionLogger* logger : m_loggers) {
        connection->addLogger(logger);
    }
}

// False for a channel that is known already.
bool ConnectionManager::rememberTapped(std::shared_ptr<IDataConnection> const& connection)
{
    std::erase_if(m_tapped, [](auto const& tapped) { return tapped.expired(); });
    auto const isSame = [&connection](auto const& tapped) { return tapped.lock() == connection; };
    if (std::any_of(m_tapped.begin(), m_tapped.end(), isSame)) {
        return false;
    }
    m_tapped.push_back(connection);
    return true;
}

void ConnectionManager::forgetAttempted()
{
    std::lock_guard const lock(m_loggerMutex);
    m_attempted.reset();
}

void ConnectionManager::addLogger(IConnectionLogger* logger)
{
    std::lock_guard const lock(m_loggerMutex);
    std::shared_ptr<IDataConnection> const attempted = m_attempted.lock();
    if (attempted != nullptr) {
        attempted->addLogger(logger);
    }
    std::shared_ptr<IDataConnection> const open = openChannel();
    if (open != nullptr && open != attempted) { // it stands beside an attempt, or one that failed
        open->addLogger(logger);
    }
    m_loggers.push_back(logger);
}

std::shared_ptr<IDataConnection> ConnectionManager::openChannel()
{
    std::lock_guard const lock(m_stateMutex);
    return m_connection;
}

// From every channel that the application still holds: one that was closed or replaced bears its loggers on.
void ConnectionManager::removeLogger(IConnectionLogger* logger)
{
    std::lock_guard const lock(m_loggerMutex);
    for (std::weak_ptr<IDataConnection> const& tapped : m_tapped) {
        if (std::shared_ptr<IDataConnection> const connection = tapped.lock()) {
            connection->removeLogger(logger);
        }
    }
    removeFirst(m_loggers, logger);
}

void ConnectionManager::notifyPhase(int phase)
{
    std::lock_guard const lock(m_listenerMutex);
    for (IConnectionPhaseListener* listener : m_phaseListeners) {
        listener->onPhaseChanged(phase);
    }
    tervex::sleepMillis(phasePauseMs);
}

} // namespace obd
