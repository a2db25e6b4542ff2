#pragma once

#include <filesystem>
#include <string>

namespace velmora {

// Where the watch keeps what it has to remember: STATE_DIRECTORY, as service managers set it, else velmora in
// XDG_STATE_HOME or in .local/state of HOME. Made if it is missing. Throws Error.
std::filesystem::path stateFolder();

// Whether a service manager gave the folder.
bool runsAsService();

// The made-up name of a vehicle that was given none: made once and kept in the folder. Throws Error.
std::string keptVehicleName(std::filesystem::path const& folder);

} // namespace velmora
