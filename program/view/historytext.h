#pragma once

#include "libvelmora/history/changes.h"
#include "libvelmora/history/keptscan.h"
#include "program/view/style.h"

#include <string>
#include <vector>

namespace velmora::cli {

// The vehicles, and below each its scans: number, local time, lamp and codes.
std::string historyText(std::vector<KeptScan> const& scans, Style const& style);

// Both scans, and what changed between them.
std::string diffText(KeptScan const& older, KeptScan const& newer, std::vector<Change> const& changes,
                     Style const& style);

} // namespace velmora::cli
