#pragma once

#include <filesystem>
#include <string>

namespace velmora {

// Whether a file can be written to: makes it if it does not stand, and changes it no further. Throws Error for one that
// can't, and for a pipe that nobody reads, which would hold up whoever opens it. what names the file's use, such as
// "trace file".
void requireWritable(std::filesystem::path const& file, std::string const& what);

// Throws Error of wrong use for what stands there and is no plain file: a folder, a pipe, a device. What doesn't stand
// is fine, and so is what can't be looked at: who opens it tells why.
void requirePlainFile(std::filesystem::path const& file);

// Whether a file is a plain one of no more than that many bytes, so that it can be read whole. Nothing if it is; else
// why not.
std::string whyUnreadable(std::filesystem::path const& file, std::uintmax_t largest);

} // namespace velmora
