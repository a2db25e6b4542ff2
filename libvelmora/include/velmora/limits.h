#pragma once

#include <velmora/export.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

/// What sensors' values should stay in, by the user's settings: `velmora settings limit.RPM 6000`.

namespace velmora {

/// What a sensor's value should stay in, in its metric unit; views mark values outside.
struct SensorLimit
{
    std::optional<double> lowest;  ///< none if empty
    std::optional<double> highest; ///< none if empty

    /// Whether it should not be like that.
    bool isOutside(double value) const { return (lowest && value < *lowest) || (highest && value > *highest); }
    /// Whether both ends are the same.
    bool operator==(SensorLimit const&) const = default;
};

/// Reads "6000" and "..6000" (at most), "11.8.." (at least), "11.8..14.8". Throws Error for any other text.
VELMORA_EXPORT SensorLimit parseLimit(std::string const& text);
/// "..6000", "11.8..", "11.8..14.8"; empty for none.
VELMORA_EXPORT std::string limitText(SensorLimit const& limit);
/// The key that a sensor's limit is kept under: that of a PID in any usual form or by any of its names, else the text
/// itself, for a signal's id. Throws Error for a text that can be neither.
VELMORA_EXPORT std::string limitKey(std::string const& sensor);

/// The limits in a settings file, as they stood when it was opened. One thread.
class VELMORA_EXPORT SensorLimits
{
public:
    /// velmora/settings.toml in the user's configuration folder if the name is empty. A file that does not exist has no
    /// limits. Throws Error for one that can't be read.
    explicit SensorLimits(std::string const& settingsFile = {});
    ~SensorLimits();
    SensorLimits(SensorLimits const&) = delete;
    SensorLimits& operator=(SensorLimits const&) = delete;

    /// By a sensor's key. None for a sensor without, and for a text that is no limit.
    SensorLimit of(std::string const& key) const;
    /// The keys of all sensors that have one.
    std::vector<std::string> sensors() const;
    /// Writes it into the file; a limit without ends is removed. Throws Error if it can't.
    void set(std::string const& key, SensorLimit const& limit);

private:
    struct Parts;
    std::unique_ptr<Parts> m_parts;
};

} // namespace velmora
