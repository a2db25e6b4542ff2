#pragma once

#include "libobd/bytes/bytes.h"

#include <string>

namespace obd {

// Texts of service 09 are filled up with zero bytes, in front, behind or, by some modules, in the middle. What remains
// is taken as it stands and may hold any byte.

// Without the zero bytes at both ends.
std::string trimmedText(ByteView bytes);

// Without any zero byte.
std::string compactText(ByteView bytes);

// Each byte as two upper-case hexadecimal digits.
std::string hexText(ByteView bytes);

} // namespace obd
