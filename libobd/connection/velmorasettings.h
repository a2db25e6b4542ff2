#pragma once

#include "libobd/connection/connectionoptions.h"
#include "libobd/connection/settingskeys.h"

#include <common/eventproducer.h>
#include <obd/isettings.h>
#include <obd/ivelmorasettings.h>

#include <memory>

namespace obd {

// The typed settings on top of the application's store. Holds no value of its own but the connection options.
class VelmoraSettings : public IVelmoraSettings, public tervex::EventProducer<VelmoraSettingsEvent>
{
public:
    // settings must not be null.
    explicit VelmoraSettings(std::shared_ptr<ISettings> const& settings);

    IConnectionOptions* connectionOptions() override { return &m_connectionOptions; }
    UnitSystem unitSystem() const override;
    void setUnitSystem(UnitSystem system) override;
    int language() const override;
    void setLanguage(int language) override;
    bool fuelTypeOverride() const override;
    void setFuelTypeOverride(bool enabled) override;
    IgnitionType ignitionType() const override;
    void setIgnitionType(IgnitionType type) override;
    float fuelCorrectionFactor() const override;
    void setFuelCorrectionFactor(float factor) override;
    int volumetricEfficiency() const override;
    void setVolumetricEfficiency(int percent) override;
    float engineDisplacement() const override;
    void setEngineDisplacement(float litres) override;
    int vehicleWeight() const override;
    void setVehicleWeight(int kilograms) override;

private:
    int read(settings::IntKey const& key) const;
    void write(settings::IntKey const& key, int value, VelmoraSettingsEvent event);

    std::shared_ptr<ISettings> m_settings;
    ConnectionOptions m_connectionOptions;
};

} // namespace obd
