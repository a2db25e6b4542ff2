#include "libobd/connection/velmorasettings.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace obd {
namespace {

float fromHundredths(int value)
{
    return static_cast<float>(value / 100.0);
}

// Cuts off what is finer than a hundredth. A float reaches beyond the integers, hence the limits.
int toHundredths(float value)
{
    double const hundredths = value * 100.0F;
    if (std::isnan(hundredths)) {
        return 0;
    }
    return static_cast<int>(std::clamp(hundredths, static_cast<double>(std::numeric_limits<int>::min()),
                                       static_cast<double>(std::numeric_limits<int>::max())));
}

} // namespace

VelmoraSettings::VelmoraSettings(std::shared_ptr<ISettings> const& settings)
    : m_settings(settings), m_connectionOptions(settings)
{}

int VelmoraSettings::read(settings::IntKey const& key) const
{
    return settings::readInt(*m_settings, key);
}

void VelmoraSettings::write(settings::IntKey const& key, int value, VelmoraSettingsEvent event)
{
    m_settings->setInt(key.key, value);
    fire(event);
}

UnitSystem VelmoraSettings::unitSystem() const
{
    return static_cast<UnitSystem>(read(settings::unitSystem));
}

void VelmoraSettings::setUnitSystem(UnitSystem system)
{
    write(settings::unitSystem, static_cast<int>(system), VelmoraSettingsEvent::UnitSystemChanged);
}

int VelmoraSettings::language() const
{
    return read(settings::language);
}

void VelmoraSettings::setLanguage(int language)
{
    write(settings::language, language, VelmoraSettingsEvent::LanguageChanged);
}

bool VelmoraSettings::fuelTypeOverride() const
{
    return read(settings::fuelTypeOverride) != 0;
}

void VelmoraSettings::setFuelTypeOverride(bool enabled)
{
    write(settings::fuelTypeOverride, enabled ? 1 : 0, VelmoraSettingsEvent::FuelTypeOverrideChanged);
}

IgnitionType VelmoraSettings::ignitionType() const
{
    return static_cast<IgnitionType>(read(settings::ignitionType));
}

void VelmoraSettings::setIgnitionType(IgnitionType type)
{
    write(settings::ignitionType, static_cast<int>(type), VelmoraSettingsEvent::IgnitionTypeChanged);
}

float VelmoraSettings::fuelCorrectionFactor() const
{
    return fromHundredths(read(settings::fuelCorrectionFactor));
}

void VelmoraSettings::setFuelCorrectionFactor(float factor)
{
    write(settings::fuelCorrectionFactor, toHundredths(factor), VelmoraSettingsEvent::FuelCorrectionFactorChanged);
}

int VelmoraSettings::volumetricEfficiency() const
{
    return read(settings::volumetricEfficiency);
}

void VelmoraSettings::setVolumetricEfficiency(int percent)
{
    write(settings::volumetricEfficiency,
          std::clamp(percent, settings::volumetricEfficiency.lowest, settings::volumetricEfficiency.highest),
          VelmoraSettingsEvent::VolumetricEfficiencyChanged);
}

float VelmoraSettings::engineDisplacement() const
{
    return fromHundredths(read(settings::engineDisplacement));
}

void VelmoraSettings::setEngineDisplacement(float litres)
{
    write(settings::engineDisplacement, toHundredths(litres), VelmoraSettingsEvent::EngineDisplacementChanged);
}

int VelmoraSettings::vehicleWeight() const
{
    return read(settings::vehicleWeight);
}

void VelmoraSettings::setVehicleWeight(int kilograms)
{
    write(settings::vehicleWeight, kilograms, VelmoraSettingsEvent::VehicleWeightChanged);
}

} // namespace obd
