#pragma once

#include <string>

namespace velmora {

// Puts "xx" in place of the last three bytes of each hardware address in a text: six bytes in hexadecimal with the same
// ':', '-' or '_' between them. The first three, which tell the maker of the radio, stay.
std::string withoutMacs(std::string text);

} // namespace velmora
