#pragma once

#include "libvelmora/uds/foundmodule.h"

#include <nlohmann/json_fwd.hpp>

#include <filesystem>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// The modules that were found of each vehicle, by VIN, in a small file. A file that can't be read is as none.
class ModuleStore
{
public:
    explicit ModuleStore(std::filesystem::path file) : m_file(std::move(file)) {}

    std::optional<std::vector<FoundModule>> find(std::string const& vin) const;
    // Throws Error if the file can't be written.
    void keep(std::string const& vin, std::vector<FoundModule> const& modules) const;

    // The file that goes with a settings file.
    static std::filesystem::path besides(std::filesystem::path const& settings);

private:
    nlohmann::json read() const;

    std::filesystem::path m_file;
};

nlohmann::ordered_json toJsonValue(FoundModule const& module);

} // namespace velmora
