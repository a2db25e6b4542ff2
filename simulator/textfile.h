#pragma once

#include <optional>
#include <string>

namespace obdsim {

/// The whole file, nothing if it can't be read.
std::optional<std::string> readTextFile(std::string const& path);

} // namespace obdsim
