#pragma once

#include <velmora/export.h>

#include <memory>
#include <string>
#include <vector>

namespace velmora {

class SettingsStore;

/// The settings file: what derived values depend on, and the limits that views mark values by. A file that does not
/// exist has all defaults. What is set is on the disk when the function returns. For one thread.
class VELMORA_EXPORT SettingsFile
{
public:
    /// One setting of the vehicle, in texts as people write them.
    struct Setting
    {
        std::string name;        ///< "displacement"
        std::string title;       ///< "Engine displacement"
        std::string value;       ///< "1.60", "metric"; the default where the file has none, or one out of range
        std::string unit;        ///< "l"; empty for none
        std::string range;       ///< "0.05 to 30.00", "metric or imperial"
        std::string fallback;    ///< the default
        std::string key;         ///< of <velmora/settings.h>
        std::string explanation; ///< a sentence or two
    };

    /// Empty for velmora/settings.toml in the user's configuration folder. Throws Error for a file that can't be read
    /// or understood.
    explicit SettingsFile(std::string const& file = {});
    ~SettingsFile();
    SettingsFile(SettingsFile const&) = delete;
    SettingsFile& operator=(SettingsFile const&) = delete;

    std::string path() const; ///< of the file

    /// All of them, in the order of their listing.
    std::vector<Setting> settings() const;
    /// The one of that name. Throws Error with the names there are.
    Setting setting(std::string const& name) const;
    /// From what a person typed. Throws Error that tells the names, or the range, or that the file can't be written.
    void set(std::string const& name, std::string const& value);

    /// The keys of all sensors that have a limit.
    std::vector<std::string> limitedSensors() const;
    /// The key that a sensor's limit is kept under: of a PID in any usual form, of any of its names, or a signal's id.
    /// Throws Error for a text that can be none.
    static std::string limitKey(std::string const& sensor);
    /// "..6000", "11.8..", "11.8..14.8", in the sensor's metric unit; empty for none. By limitKey.
    std::string limit(std::string const& key) const;
    /// Reads "6000", which is the highest value, and what limit gives; "none" takes it away. Throws Error for any other
    /// text.
    void setLimit(std::string const& key, std::string const& limit);

private:
    std::unique_ptr<SettingsStore> m_store;
};

} // namespace velmora
