#pragma once

#include <velmora/vin.h>

#include <string>

namespace velmora {

// Whether the text is a vehicle identification number in the standard's form: 17 capital letters and digits without I,
// O and Q.
bool isVin(std::string const& text);

// The number in the standard's form from one that was typed: any case, with blanks and hyphens. Throws Error that tells
// what is wrong.
std::string parseVin(std::string const& text);

// vin must be one. thisYear: no model year lies more than a year behind it.
VinFacts decodeVin(std::string const& vin, int thisYear);

} // namespace velmora
