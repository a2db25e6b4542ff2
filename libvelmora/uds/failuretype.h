#pragma once

#include <string>

namespace velmora {

// The failure type byte of a trouble code (SAE J2012) in words, where public lists agree on them; else its category and
// the byte: "Algorithm Based Failure 6A".
std::string failureTypeText(unsigned char type);

} // namespace velmora
