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

std::vector<std::string> SettingsFile::unknownKeys() const
{
    std::vector<std::string> keys = m_store->keysBelow({});
    std::erase_if(keys, isKnownKey);
    return keys;
}

std::optional<std::string> SettingsFile::text(std::string const& key) const
{
    std::string text;
    return m_store->getString(key, text) ? std::optional(text) : std::nullopt;
}

std::optional<int> SettingsFile::number(std::string const& key) const
{
    int number = 0;
    return m_store->getInt(key, number) ? std::optional(number) : std::nullopt;
}

void SettingsFile::setText(std::string const& key, std::string const& text)
{
    m_store->setString(key, text);
    m_store->sync();
}

void SettingsFile::setNumber(std::string const& key, int number)
{
    m_store->setInt(key, number);
    m_store->sync();
}

} // namespace velmora
