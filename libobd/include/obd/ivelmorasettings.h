#pragma once

#include <obd/ignitiontype.h>
#include <obd/unitsystem.h>
#include <tervex/ieventproducer.h>

namespace obd {

class IConnectionOptions;

/// Which setting was set. Fired also when the value is the same as before.
enum class VelmoraSettingsEvent : int
{
    UnitSystemChanged = 0,
    LanguageChanged = 1,
    FuelCorrectionFactorChanged = 2,
    VolumetricEfficiencyChanged = 3,
    EngineDisplacementChanged = 4,
    FuelTypeOverrideChanged = 5,
    IgnitionTypeChanged = 6,
    VehicleWeightChanged = 7,
};

/// The settings of display and vehicle. Every getter asks the application's store anew, so a change made there directly
/// is seen at the next read, without an event. A stored value out of range reads as the default. A setter writes at
/// once, then fires its event on the calling thread; a listener must not call a setter again.
class IVelmoraSettings
    : public virtual tervex::IEventProducer<VelmoraSettingsEvent, tervex::IEventListener<VelmoraSettingsEvent>>
{
public:
    /// Lives as long as the settings.
    virtual IConnectionOptions* connectionOptions() = 0;

    virtual UnitSystem unitSystem() const = 0;         ///< default metric
    virtual void setUnitSystem(UnitSystem system) = 0; ///< fires UnitSystemChanged

    /// Number of the language of the trouble code texts, 0 to 19, default 0.
    virtual int language() const = 0;
    virtual void setLanguage(int language) = 0; ///< fires LanguageChanged

    /// Whether ignitionType stands in for what the vehicle reports, default false.
    virtual bool fuelTypeOverride() const = 0;
    virtual void setFuelTypeOverride(bool enabled) = 0; ///< fires FuelTypeOverrideChanged

    virtual IgnitionType ignitionType() const = 0;       ///< default spark
    virtual void setIgnitionType(IgnitionType type) = 0; ///< fires IgnitionTypeChanged

    /// Factor on the derived fuel consumption, default 1.0. Stored in hundredths, the rest is cut off; a value beyond
    /// what the store takes is limited, and one that is no number is stored as 0.
    virtual float fuelCorrectionFactor() const = 0;
    virtual void setFuelCorrectionFactor(float factor) = 0; ///< fires FuelCorrectionFactorChanged

    /// In percent, 0 to 100, default 85. The setter limits to this range.
    virtual int volumetricEfficiency() const = 0;
    virtual void setVolumetricEfficiency(int percent) = 0; ///< fires VolumetricEfficiencyChanged

    /// In litres, default 2.0. Stored as fuelCorrectionFactor is.
    virtual float engineDisplacement() const = 0;
    virtual void setEngineDisplacement(float litres) = 0; ///< fires EngineDisplacementChanged

    /// In kilograms, at least 0, default 1500.
    virtual int vehicleWeight() const = 0;
    virtual void setVehicleWeight(int kilograms) = 0; ///< fires VehicleWeightChanged
};

} // namespace obd
