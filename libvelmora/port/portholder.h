#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// Where the system tells who uses a port; other places are for tests.
struct HolderPlaces
{
    std::vector<std::filesystem::path> lockFolders{"/run/lock", "/var/lock"};
    std::filesystem::path processes{"/proc"};
};

// The other program that holds a serial port: by its lock file, or by what is readable of the processes' open files.
// "minicom (process 1234)". Nothing where none is seen, which a port of another user's program may be as well.
std::optional<std::string> findPortHolder(std::string const& device, HolderPlaces const& places = {});

} // namespace velmora
