#pragma once

#include <ctime>

namespace tervex {

// The C library's localtime and mktime behind one lock, since they share static state.
std::tm toLocalTime(std::time_t seconds);

// Seconds since the epoch of local fields; negative if they can't be told. fields.tm_isdst is taken as it stands.
std::time_t fromLocalTime(std::tm fields);

} // namespace tervex
