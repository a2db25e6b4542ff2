#pragma once

#include "libvelmora/report/json.h"

#include <velmora/history.h>

#include <string>
#include <string_view>

namespace velmora {

// Sixteen hexadecimal digits that tell documents apart; no proof against intent.
std::string hashOf(std::string const& document);

// One line of an export, with its line feed.
std::string toLine(KeptScan const& scan);

// Throws Error for anything that toLine did not write: a member that is missing, a report that can't be read, a hash
// that is that of another document.
KeptScan parseLine(std::string_view line);

// "2026-05-01T10:00:00.000Z", also of years that the system's clock can't hold.
std::string timeText(std::chrono::sys_time<std::chrono::milliseconds> time);

} // namespace velmora
