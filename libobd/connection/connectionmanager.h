#pragma once

#include <obd/iconnectionmanager.h>

#include <memory>
#include <mutex>
#include <vector>

namespace obd {

class ConnectionManager : public IConnectionManager
{
public:
    // Makes the proxy and hands it to the dispatcher.
    ConnectionManager();
    ~ConnectionManager() override;
    ConnectionManager(ConnectionManager const&) = delete;
    ConnectionManager& operator=(ConnectionManager const&) = delete;

    void addPhaseListener(IConnectionPhaseListener* listener) override;
    void removePhaseListener(IConnectionPhaseListener* listener) override;
    bool openConnection(std::shared_ptr<IDataConnection> const& connection, VehicleProtocol protocol,
                        bool restoreAdapter) override;
    bool isBusy() override;
    void closeConnection() override;
    std::shared_ptr<IDevice> getAdapter() override;
    std::shared_ptr<IObdProxy> getProxy() override { return m_proxy; }
    void addLogger(IConnectionLogger* logger) override;
    void removeLogger(IConnectionLogger* logger) override;

private:
    bool open(std::shared_ptr<IDataConnection> const& connection, VehicleProtocol protocol, bool restoreAdapter);
    void attachLoggers(std::shared_ptr<IDataConnection> const& connection);
    bool rememberTapped(std::shared_ptr<IDataConnection> const& connection);
    void forgetAttempted();
    std::shared_ptr<IDataConnection> openChannel();
    void notifyPhase(int phase);
    void storeDevice(std::shared_ptr<IDevice> device);
    void storeConnection(std::shared_ptr<IDataConnection> connection);

    // Held for a whole opening or closing. Comes before the listener mutex, which comes before a notifier list's.
    std::mutex m_connectionMutex;
    std::shared_ptr<IObdProxy> const m_proxy;

    std::mutex m_listenerMutex;
    std::vector<IConnectionPhaseListener*> m_phaseListeners; // not owned; protected by m_listenerMutex

    // A leaf: getters answer while an opening lasts.
    std::mutex m_stateMutex;
    std::shared_ptr<IDataConnection> m_connection; // set once it is fully open; protected by m_stateMutex
    std::shared_ptr<IDevice> m_device;             // set once it is initialised; protected by m_stateMutex

    // Held while a logger goes on or off a channel, so that none is lost or left behind during an opening.
    std::mutex m_loggerMutex;
    std::vector<IConnectionLogger*> m_loggers;            // not owned; protected by m_loggerMutex
    std::weak_ptr<IDataConnection> m_attempted;           // of the latest opening; protected by m_loggerMutex
    std::vector<std::weak_ptr<IDataConnection>> m_tapped; // all that may bear loggers; protected by m_loggerMutex
};

} // namespace obd
