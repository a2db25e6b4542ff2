#pragma once

#include <velmora/settingsfile.h>

#include <cstdio>
#include <filesystem>

namespace velmora {

// Throws Error of wrong use for what stands there and is no plain file: a folder, a pipe, a device. What doesn't stand
// is fine, and so is what can't be looked at: who opens it tells why.
void requirePlainFile(std::filesystem::path const& file);

// Opens a file for writing, without what stood in it; but what standard output or standard error are redirected to is
// written on from where that stream stands. Null, with errno set, if it can't be opened.
std::FILE* openForWriting(std::filesystem::path const& file);

} // namespace velmora
