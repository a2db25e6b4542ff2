#pragma once

#include <filesystem>
#include <string>

namespace velmora {

// Whether a file can be written to: makes it if it does not stand, and changes it no further. Throws Error for one that
// can't, and for a pipe that nobody reads, which would hold up whoever opens it. what names the file's use, such as
// "trace file".
void requireWritable(std::filesystem::path const& file, std::string const& what);

// Whether a file is a plain one of no more than that many bytes, so that it can be read whole. Nothing if it is; else
// why not.
std::string whyUnreadable(std::filesystem::path const& file, std::uintmax_t largest);

} // namespace velmora
