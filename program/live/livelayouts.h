#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <vector>

namespace velmora::cli {

// How the live view of a vehicle was left.
struct LiveLayout
{
    std::vector<std::string> sensors; // as words of the command line, in their order
    bool big = true;

    bool operator==(LiveLayout const&) const = default;
};

// The layouts of all vehicles, in the file beside the settings that the page in the browser keeps its own in.
class LiveLayouts
{
public:
    explicit LiveLayouts(std::filesystem::path const& settings) : m_file(settings.parent_path() / "layouts.toml") {}

    // Nothing if there is none, or none that can be read.
    std::optional<LiveLayout> load(std::string const& vehicle) const;
    // Throws Error if it can't be written.
    void save(std::string const& vehicle, LiveLayout const& layout) const;

private:
    std::filesystem::path const m_file;
};

} // namespace velmora::cli
