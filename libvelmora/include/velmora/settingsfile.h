#pragma once

#include <velmora/export.h>

#include <cstdint>
#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

class SettingsStore;

/// The settings file: what derived values depend on. <velmora/limits.h> has the limits in it. A file that does not
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

    /// The keys of the file that neither library nor companion reads: mistyped ones, and what applications keep there
    /// of their own.
    std::vector<std::string> unknownKeys() const;

    /// What an application keeps there of its own, by keys such as "live/vehicle" that name a group and a value in it;
    /// nothing where there is none.
    std::optional<std::string> text(std::string const& key) const;
    std::optional<int> number(std::string const& key) const; ///< as text
    /// Throws Error if the file can't be written.
    void setText(std::string const& key, std::string const& text);
    void setNumber(std::string const& key, int number); ///< as setText

private:
    std::unique_ptr<SettingsStore> m_store;
};

/// The user's folder for what programs of the companion write: velmora in XDG_DATA_HOME, or in .local/share of HOME. It
/// need not exist.
VELMORA_EXPORT std::filesystem::path userDataFolder();

/// Whether a file can be written to: makes it if it does not stand, and changes it no further. Throws Error for one
/// that can't, and for a pipe that nobody reads, which would hold up whoever opens it. what names the file's use, such
/// as "trace file".
VELMORA_EXPORT void requireWritable(std::filesystem::path const& file, std::string const& what);
/// Whether a file is a plain one of no more than that many bytes, so that it can be read whole. Nothing if it is; else
/// why not.
VELMORA_EXPORT std::string whyUnreadable(std::filesystem::path const& file, std::uintmax_t largest);

} // namespace velmora
