#pragma once

#include <string>

namespace obd {

/// A small store of keys and values that the application implements: the only place where the library remembers
/// anything. Keys are plain strings with "/" as the separator. Called on whichever thread asks for a setting, so
/// several threads may be inside at once. An exception reaches whoever asked for the setting.
class ISettings
{
public:
    virtual ~ISettings() = default;

    virtual void setInt(std::string const& key, int value) = 0;                   ///< replaces what the key had
    virtual void setString(std::string const& key, std::string const& value) = 0; ///< replaces what the key had

    /// False, with value untouched, if the key has no value.
    virtual bool getInt(std::string const& key, int& value) = 0;
    virtual bool getString(std::string const& key, std::string& value) = 0; ///< the same of a text

    /// Brings what was set to permanent storage. For the application's own use: the library never calls it.
    virtual void sync() = 0;
};

} // namespace obd
