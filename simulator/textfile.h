#pragma once

#include <cstdint>
#include <cstdio>
#include <optional>
#include <string>

namespace obdsim {

/// The largest recording and the largest description of a car or a scenario that are read, in bytes.
inline constexpr std::uintmax_t largestRecording = 256U << 20U;
inline constexpr std::uintmax_t largestDescription = 4U << 20U;

/// The whole of a plain file that has at most `largest` bytes, nothing if it can't be read. Devices and pipes, which
/// may have no end or no beginning, are not opened.
std::optional<std::string> readTextFile(std::string const& path, std::uintmax_t largest = largestDescription);

/// Why readTextFile gives nothing, such as "it is no plain file".
std::string whyNoText(std::string const& path, std::uintmax_t largest = largestDescription);

/// Opens a file for writing, without what stood in it; but what standard output or standard error are redirected to is
/// written on behind what stands there. A pipe that nobody reads is refused rather than waited for. Null, with errno
/// set, if it can't be opened.
std::FILE* openForWriting(std::string const& path);

/// Opens a file for what is written later by openForWriting, so that what forbids it is known at once: nothing that
/// stands there changes, a file that is missing is made, and who reads a pipe sees no end of it meanwhile. Null, with
/// errno set, if it can't be opened.
std::FILE* keepForWriting(std::string const& path);

} // namespace obdsim
