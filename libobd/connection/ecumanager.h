#pragma once

#include <common/eventproducer.h>
#include <obd/iconnectionnotifier.h>
#include <obd/iecumanager.h>
#include <obd/ivelmorasettings.h>
#include <obd/unitsystem.h>

#include <memory>
#include <mutex>
#include <vector>

namespace obd {

class IConnectionNotifier;
class IObdProxy;
class IVelmoraSettings;

class EcuManager : public tervex::EventProducer<EcuManagerEvent>,
                   public IEcuManager,
                   public IConnectionNotifierListener,
                   public tervex::IEventListener<VelmoraSettingsEvent>
{
public:
    // Attaches to the notifier at priority 0, ahead of the services, and to the settings. All three must outlive it.
    EcuManager(IConnectionNotifier& notifier, IObdProxy* proxy, IVelmoraSettings* settings);
    ~EcuManager() override;
    EcuManager(EcuManager const&) = delete;
    EcuManager& operator=(EcuManager const&) = delete;

    std::shared_ptr<IEcu> getCurrentEcu() override;
    void setCurrentEcu(unsigned int id) override;
    void getEcuIds(std::vector<unsigned int>& ids) override;
    std::vector<std::shared_ptr<IEcu>> getEcus() override;
    std::string getEcuName(unsigned int id) override;
    std::string getEcuDescription(unsigned int id) override;
    std::vector<std::shared_ptr<ParameterDescriptor>> getParameters(unsigned int id) override;

    void onConnectionOpened() override;
    void onConnectionClosed() override;
    void onEvent(VelmoraSettingsEvent const& event) override;

private:
    std::shared_ptr<IEcu> find(unsigned int id);
    UnitSystem unitSystem();
    void replace(std::vector<std::shared_ptr<IEcu>> ecus, std::shared_ptr<IEcu> current);

    IConnectionNotifier& m_notifier;
    IObdProxy* m_proxy;
    IVelmoraSettings* m_settings;

    // A leaf: listeners call back while an event is fired.
    std::mutex m_mutex;
    std::vector<std::shared_ptr<IEcu>> m_ecus; // protected by m_mutex
    std::shared_ptr<IEcu> m_currentEcu;        // protected by m_mutex
    UnitSystem m_unitSystem;                   // protected by m_mutex
};

} // namespace obd
