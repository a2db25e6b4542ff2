#pragma once

#include <cstdint>
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

} // namespace obdsim
