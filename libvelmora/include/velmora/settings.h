#pragma once

/// Keys of the vehicle settings, in the settings file as groups of TOML and in an application's own obd::ISettings
/// store. All are whole numbers. A number out of its range reads as the default.
namespace velmora::settings {

inline constexpr char const* unitSystem = "common/unitsystem"; ///< 0 metric, 1 imperial; default 0
/// Of imperial units, which the companion and its program see to: 0 gallons of the US, 1 of the United Kingdom;
/// default 0.
inline constexpr char const* gallon = "velmora/gallon";

inline constexpr char const* engineDisplacement = "common/enginedisplacement"; ///< hundredths of a litre, default 200
inline constexpr char const* volumetricEfficiency = "common/volumetricefficiency"; ///< percent, 0 to 100, default 85
inline constexpr char const* vehicleWeight = "common/vehicleweight";               ///< kilograms, from 0, default 1500
/// Factor on the derived fuel consumption, in hundredths, default 100.
inline constexpr char const* fuelCorrectionFactor = "common/fuelcorrectionfactor";
/// Whether ignitionType stands in for what the vehicle reports: 0 no, anything else yes; default 0.
inline constexpr char const* fuelTypeOverride = "common/fueltypeoverride";
inline constexpr char const* ignitionType = "common/ignitiontype"; ///< 0 spark, 1 compression; default 0

} // namespace velmora::settings
