#pragma once

#include "libvelmora/report/moduletopic.h"

#include <obd/diagnosticdatamodels.h>

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// How many monitors the module has that have not run since the codes were cleared.
std::size_t countNotComplete(ReadinessReport const& report);

// Whether the module has monitors and all have run; nothing if it has none or told nothing.
std::optional<bool> isReady(ReadinessReport const& report);

// "complete", "not complete", "disabled this cycle" or "not available".
char const* statusWord(ReadinessStatus status);

// What is not complete first, what the vehicle does not have last; else as they were.
std::vector<ReadinessMonitor> notCompleteFirst(std::vector<ReadinessMonitor> monitors);

Json toJsonValue(ReadinessReport const& report);

} // namespace velmora
