#pragma once

namespace obd {

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

} // namespace obd
