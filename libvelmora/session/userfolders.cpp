#include "libvelmora/session/userfolders.h"

#include <cstdlib>
#include <string>

namespace velmora {

std::filesystem::path userDataFolder()
{
    char const* const data = std::getenv("XDG_DATA_HOME");
    if (data != nullptr && *data != '\0') {
        return std::filesystem::path(data) / "velmora";
    }
    char const* const home = std::getenv("HOME");
    return std::filesystem::path(home != nullptr ? home : "") / ".local" / "share" / "velmora";
}

} // namespace velmora
