#pragma once

#include "libvelmora/report/json.h"

#include <filesystem>

namespace velmora {

// The limits that stand in the settings, by the key of their sensor: {"RPM": [null, 6000]}, in metric units. Empty
// where the settings can't be read. Read anew each time, as they are set by a program of its own.
Json dashLimits(std::filesystem::path const& settings);

} // namespace velmora
