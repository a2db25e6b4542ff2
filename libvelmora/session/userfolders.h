#pragma once

#include <filesystem>

namespace velmora {

// The program's folder among the user's data: velmora in XDG_DATA_HOME, or in .local/share of HOME. It need not exist.
std::filesystem::path userDataFolder();

} // namespace velmora
