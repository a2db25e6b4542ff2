#pragma once

#include "libvelmora/replay/recording.h"

#include <filesystem>

namespace velmora {

// All readings of a database of the output sqlite. Throws Error for another one, and in a build without that output.
Recording readDatabase(std::filesystem::path const& file);

} // namespace velmora
