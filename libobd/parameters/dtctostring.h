#pragma once

#include <string>
#include <vector>

namespace obd {

// The text of a trouble code from its first two bytes, such as "P0133" from 01 33 (SAE J2012). Empty where the lower 12
// bits are zero: that is how a vehicle fills places that hold no code. Throws std::out_of_range for less than two
// bytes.
std::string dtcToString(std::vector<unsigned char> const& bytes);

} // namespace obd
