#pragma once

#include <obd/isettings.h>

#include <filesystem>
#include <map>
#include <mutex>
#include <string>
#include <variant>
#include <vector>

namespace velmora {

// The library's settings in a TOML file, one table a group: the key "common/unitsystem" is unitsystem in [common]. The
// file is read once and written as a whole, to a temporary file first, so that a crash or a full disk never loses the
// old one. A number with a point is understood where hundredths are stored.
class SettingsStore : public obd::ISettings
{
public:
    // A file that does not exist is an empty store. Throws Error for one that can't be read or understood.
    explicit SettingsStore(std::filesystem::path file);

    void setInt(std::string const& key, int value) override;
    void setString(std::string const& key, std::string const& value) override;
    bool getInt(std::string const& key, int& value) override;
    bool getString(std::string const& key, std::string& value) override;
    // As if the key had never been set.
    void remove(std::string const& key);
    // What stands behind that beginning in the keys that have it.
    std::vector<std::string> keysBelow(std::string const& beginning);
    // Writes the file. Throws Error if it can't.
    void sync() override;

    std::filesystem::path const& file() const { return m_file; }

    // The file in the user's configuration folder: XDG_CONFIG_HOME, or .config in HOME.
    static std::filesystem::path defaultFile();

private:
    using Value = std::variant<int, std::string>;

    template <typename T>
    bool get(std::string const& key, T& value);
    void refuseWrongValues() const;
    std::string toToml() const;

    std::filesystem::path m_file;
    std::mutex m_mutex;
    std::map<std::string, Value> m_values; // protected by m_mutex
};

} // namespace velmora
