#pragma once

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// Whose request it is; each may send other services, and all of them only read.
enum class RequestPurpose
{
    Signal,   // of a signal file, of a built-in definition, of a probe: 01 02 05 06 09 1A 21 22
    Codes,    // of the readers of trouble codes: 03 07 0A 12 13 17 18, and 19 by its sub-functions
    Presence, // of who asks whether a module is there: 3E 00, 3E 80, and 3E 01 and 02 of KWP2000
};

// Why this request may not be sent for this purpose, or nothing. What is not known here to read only is refused.
std::optional<std::string> refusalFor(std::vector<unsigned char> const& request, RequestPurpose purpose);

} // namespace velmora
