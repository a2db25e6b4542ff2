#pragma once

#include "simulator/car/moduledata.h"

namespace obdsim {

/// Marks the monitor of that name in `bits`; `incomplete` marks it as not
/// complete instead of present. False for a name that the kind of engine has not.
bool markMonitor(std::string const& name, bool compression, bool incomplete, MonitorBits& bits);

/// "P0133" as the two bytes that modules send; nothing for any other text.
std::optional<std::uint16_t> parseCode(std::string const& text);

} // namespace obdsim
