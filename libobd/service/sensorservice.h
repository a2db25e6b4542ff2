#pragma once

#include "libobd/service/ask.h"
#include "libobd/service/sensorset.h"

#include <obd/isensorservice.h>
#include <tervex/notifier.h>

#include <atomic>
#include <mutex>

namespace obd {

// Each selected parameter has a query of its own that queues itself again when it has finished, so all of them take
// turns on the dispatcher's worker. A selected control module, or the closing of a connection, arrives on a thread of
// its own: what the service knows of the module is one set behind a mutex, replaced as a whole.
class SensorService : public ISensorService, public BaseService, public tervex::Notifier<ISensorServiceObserver>
{
public:
    explicit SensorService(IObdVelmora const* obd, Following following = Following::AtOnce);
    ~SensorService() override;

    bool isConnected() const override { return BaseService::isConnected(); }
    std::vector<std::shared_ptr<ParameterDescriptor>> getDescriptors() override;
    void updateOnce(std::vector<ParameterIdentifier::Id> const& ids) override;
    void startUpdates(std::vector<ParameterIdentifier::Id> const& ids) override;
    void reset() override;
    std::vector<ParameterIdentifier::Id> getSupportedIds() override;
    std::shared_ptr<ParameterDataModel> getParameter(ParameterIdentifier::Id id) override;
    std::vector<std::shared_ptr<SensorDataModel>> fetchSensors(ParameterIdentifier::Id id) override;
    bool isSupported(ParameterIdentifier::Id id) override;
    Outcome<std::vector<std::shared_ptr<SensorDataModel>>> askSensors(ParameterIdentifier::Id id) override;

protected:
    void startFollowing() override;
    void stopFollowing() override;

private:
    using ParameterQuery = SensorSet::ParameterQuery;

    // The second attachment to the settings: BaseService's serves the unit system, this one the vehicle's facts.
    class VehicleListener : public tervex::IEventListener<VelmoraSettingsEvent>
    {
    public:
        explicit VehicleListener(SensorService& service) : m_service(service) {}
        void onEvent(VelmoraSettingsEvent const& event) override;

    private:
        SensorService& m_service;
    };

    void followVehicle();

    void onServiceConnected() override;
    void onServiceDisconnected() override;
    void onEcuChanged() override;
    void onUnitSystemChanged() override;
    void onVehicleChanged();

    virtual void onQueryFinished(bool success, std::weak_ptr<ParameterQuery> const& finished,
                                 std::shared_ptr<PowertrainParameter> const& parameter);
    Outcome<std::vector<std::shared_ptr<SensorDataModel>>> askSensors(ParameterIdentifier::Id id, bool onlyOffered);
    std::vector<std::shared_ptr<SensorDataModel>> readSensors(std::shared_ptr<PowertrainParameter> const& parameter,
                                                              std::shared_ptr<IEcu> const& current);
    void publish(ParameterQuery const& query, std::shared_ptr<PowertrainParameter> const& parameter);
    void update(std::shared_ptr<ParameterQuery> const& query);

    void clear();
    void rebuild();
    std::shared_ptr<ParameterQuery> find(ParameterIdentifier::Id id) const;
    std::shared_ptr<SensorValueDataModel> record(IEcu const& ecu, std::shared_ptr<SensorValue> const& value);

    IVelmoraSettings* const m_settings;
    std::atomic<bool> m_singleShot{false};
    mutable std::mutex m_mutex; // never held over observers, the settings or a fetch
    SensorSet m_set;            // protected by m_mutex
    VehicleListener m_vehicleListener{*this};
    std::shared_ptr<bool> const m_alive = std::make_shared<bool>(true); // tells a call whether an observer ended this
};

} // namespace obd
