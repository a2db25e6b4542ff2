#pragma once

#include <string>

namespace velmora {

// The title of a PID of service 01 above 80 that the library does not decode, by SAE J1979; "PID C2" for one that is
// not known here.
std::string pidTitle(unsigned char pid);

} // namespace velmora
