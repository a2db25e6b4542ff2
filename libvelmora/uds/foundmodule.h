#pragma once

#include <map>
#include <optional>
#include <string>

namespace velmora {

// A control module as it was found, and what it tells of itself. Texts are empty where it told none.
struct FoundModule
{
    std::string request; // identifier or header, hexadecimal
    std::string reply;
    std::string name;                                     // F197
    std::string part;                                     // F187
    std::string software;                                 // F189, else F195
    std::optional<unsigned int> codes;                    // how many trouble codes matter; nothing if it does not tell
    std::map<unsigned int, std::string> identifiers = {}; // those it told of the ones that it was asked for: F180 to
                                                          // F19F, and 1A80, 1A90, 1A9B of service 1A
};

} // namespace velmora
