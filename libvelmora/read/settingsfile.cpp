#include "libvelmora/read/sensorlimits.h"
#include "libvelmora/session/settingsstore.h"
#include "libvelmora/session/vehiclesettings.h"

#include <velmora/settingsfile.h>

namespace velmora {

namespace {

SettingsFile::Setting shownEntry(VehicleSetting const& setting, obd::ISettings& store)
{
    return {setting.name,          setting.title, shownSetting(setting, store), setting.unit, shownRange(setting),
            shownDefault(setting), setting.key,   setting.explanation};
}

} // namespace

SettingsFile::SettingsFile(std::string const& file)
    : m_store(
          std::make_unique<SettingsStore>(file.empty() ? SettingsStore::defaultFile() : std::filesystem::path(file)))
{}

SettingsFile::~SettingsFile() = default;

std::string SettingsFile::path() const
{
    return m_store->file().string();
}

std::vector<SettingsFile::Setting> SettingsFile::settings() const
{
    std::vector<Setting> all;
    for (VehicleSetting const& setting : vehicleSettings()) {
        all.push_back(shownEntry(setting, *m_store));
    }
    return all;
}

SettingsFile::Setting SettingsFile::setting(std::string const& name) const
{
    return shownEntry(findSetting(name), *m_store);
}

void SettingsFile::set(std::string const& name, std::string const& value)
{
    setSetting(findSetting(name), value, *m_store);
    m_store->sync();
}

std::vector<std::string> SettingsFile::limitedSensors() const
{
    return velmora::limitedSensors(*m_store);
}

std::string SettingsFile::limitKey(std::string const& sensor)
{
    return velmora::limitKey(sensor);
}

std::string SettingsFile::limit(std::string const& key) const
{
    return limitText(limitOf(*m_store, key));
}

void SettingsFile::setLimit(std::string const& key, std::string const& limit)
{
    velmora::setLimit(*m_store, key, limit == "none" ? SensorLimit() : parseLimit(limit));
    m_store->sync();
}

} // namespace velmora
