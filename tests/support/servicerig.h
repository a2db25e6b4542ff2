#pragma once

#include "libobd/connection/configuration.h"
#include "libobd/connection/connectionnotifier.h"
#include "libobd/connection/ecumanager.h"
#include "libobd/connection/velmorasettings.h"
#include "libobd/service/velmorainstance.h"
#include "tests/support/dispatcherrig.h"
#include "tests/support/memorysettings.h"

#include <obd/iconnectionmanager.h>
#include <obd/iobdvelmora.h>
#include <obd/parameteridentifier.h>

#include <memory>
#include <vector>

namespace support {

inline obd::ParameterIdentifier::Id pid(int id)
{
    return obd::ParameterIdentifier(id).id();
}

// Hands out the proxy of a test, and keeps the loggers that are to hear of the traffic; opens and closes nothing.
class FakeConnectionManager : public obd::IConnectionManager
{
public:
    explicit FakeConnectionManager(std::shared_ptr<obd::IObdProxy> proxy) : m_proxy(std::move(proxy)) {}

    void addPhaseListener(obd::IConnectionPhaseListener* /*listener*/) override {}
    void removePhaseListener(obd::IConnectionPhaseListener* /*listener*/) override {}
    bool openConnection(std::shared_ptr<obd::IDataConnection> const& /*connection*/, obd::VehicleProtocol /*protocol*/,
                        bool /*restoreAdapter*/) override
    {
        return false;
    }
    bool isBusy() override { return m_proxy->isConnected(); }
    void closeConnection() override {}
    std::shared_ptr<obd::IDevice> getAdapter() override { return nullptr; }
    std::shared_ptr<obd::IObdProxy> getProxy() override { return m_proxy; }
    void addLogger(obd::IConnectionLogger* logger) override { loggers.push_back(logger); }
    void removeLogger(obd::IConnectionLogger* logger) override { std::erase(loggers, logger); }

    std::vector<obd::IConnectionLogger*> loggers;

private:
    std::shared_ptr<obd::IObdProxy> m_proxy;
};

// All that a service stands on, over a fake proxy: settings, notifier, control modules and the dispatcher's worker.
// Starts without a connection. It is the current top-level object, so that builders work.
class ServiceRig : public obd::IObdVelmora
{
public:
    ServiceRig()
    {
        rig.proxy->setConnected(false);
        obd::VelmoraInstance::set(this);
    }
    ~ServiceRig() override { obd::VelmoraInstance::set(nullptr); }
    ServiceRig(ServiceRig const&) = delete;
    ServiceRig& operator=(ServiceRig const&) = delete;

    void open()
    {
        rig.proxy->setConnected(true);
        notifier.onPhaseChanged(obd::Connected);
        rig.loop.runPending();
    }
    void close()
    {
        rig.proxy->setConnected(false);
        notifier.onPhaseChanged(obd::Closed);
        rig.loop.runPending();
    }

    unsigned int getHostValue1() const override { return 0; }
    unsigned int getHostValue2() const override { return 0; }
    unsigned int getHostValue3() const override { return 0; }
    std::shared_ptr<obd::IConnectionManager> getConnectionManager() const override { return manager; }
    obd::IEcuManager* getEcuManager() const override { return &m_ecus; }
    obd::IVelmoraSettings* getSettings() const override { return &m_settings; }
    obd::IConfiguration* getConfiguration() const override { return &m_configuration; }
    obd::IConnectionNotifier* getConnectionNotifier() const override { return &notifier; }

    DispatcherRig rig;
    mutable obd::ConnectionNotifier notifier;
    std::shared_ptr<FakeConnectionManager> manager = std::make_shared<FakeConnectionManager>(rig.proxy); // may be null

private:
    mutable obd::VelmoraSettings m_settings{std::make_shared<MemorySettings>()};
    mutable obd::Configuration m_configuration;
    mutable obd::EcuManager m_ecus{notifier, rig.proxy.get(), &m_settings};
};

// Tells a service alone of a closing, so that it still has its control module, and requests still get through.
template <typename Service>
void tellClosed(Service& service)
{
    dynamic_cast<obd::IConnectionNotifierListener&>(service).onConnectionClosed();
}

} // namespace support
