#pragma once

#include <string>
#include <vector>

namespace obd {

// Upper-case hexadecimal with at least `width` digits, as requests and names are written.
std::string upperHex(unsigned int value, unsigned int width = 1);

// Lower-case hexadecimal without leading zeros, as log lines are written.
std::string lowerHex(unsigned int value);

// " 0x" and the byte in log form for each byte: " 0x41 0xc".
std::string hexDump(std::vector<unsigned char> const& bytes);

} // namespace obd
