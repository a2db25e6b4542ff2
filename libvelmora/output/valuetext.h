#pragma once

#include "libvelmora/output/record.h"

#include <string>

namespace velmora {

// "2026-03-01T08:15:00.250Z".
std::string utcTime(WallTime time);

// Milliseconds since 1970, UTC.
std::int64_t toMillis(WallTime time);
WallTime fromMillis(std::int64_t millis);

// A number with the digits that it has, without noise behind them: "12.6", "800". Nothing that is no number ("nan")
// may be given.
std::string numberText(double value);

// "7E8".
std::string moduleText(unsigned int id);

// The number of a reading; nothing if it has none, or one that is not finite.
std::optional<double> numberOf(Reading const& reading);

} // namespace velmora
