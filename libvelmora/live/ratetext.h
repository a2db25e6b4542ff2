#pragma once

#include "libvelmora/poll/pollcycle.h"

#include <string>
#include <vector>

namespace velmora {

// The rates that were asked for with those reached, for the title: "RPM 9.9 of 10 Hz, 7E9 SPEED 5 of 5 Hz". The module
// stands in front where there are several. Empty if none was asked for.
std::string reachedRates(std::vector<PollRate> const& rates);

// The same of those that are missed by more than a tenth.
std::string missedRates(std::vector<PollRate> const& rates);

} // namespace velmora
