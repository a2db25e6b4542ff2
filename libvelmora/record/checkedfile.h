#pragma once

#include <velmora/settingsfile.h>

#include <filesystem>

namespace velmora {

// Throws Error of wrong use for what stands there and is no plain file: a folder, a pipe, a device. What doesn't stand
// is fine, and so is what can't be looked at: who opens it tells why.
void requirePlainFile(std::filesystem::path const& file);

} // namespace velmora
