#pragma once

#include "libvelmora/report/json.h"

#include <filesystem>
#include <string>
#include <vector>

namespace velmora {

// How a page looks, for each vehicle, in a file beside the settings, so that a reload, another port and another browser
// find it. One thread.
class DashLayouts
{
public:
    explicit DashLayouts(std::filesystem::path file) : m_file(std::move(file)) {}

    // Null if there is none, or none that can be read.
    Json load(std::string const& vehicle) const;
    // Throws Error if it can't be written.
    void save(std::string const& vehicle, Json const& layout) const;

    // What a browser sent, with nothing in it but what layouts hold. Throws Error (wrong use) for all else.
    static Json parse(std::string const& text);
    // The ids of all sensors that the layout shows.
    static std::vector<std::string> sensorsOf(Json const& layout);

    static std::filesystem::path besides(std::filesystem::path const& settings);

private:
    std::filesystem::path const m_file;
};

} // namespace velmora
