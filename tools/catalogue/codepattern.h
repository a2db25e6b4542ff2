#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace catalogue {

// True for the five characters of a trouble code: P, B, C or U, a digit from 0 to 3, three hexadecimal digits in upper
// case.
bool isTroubleCode(std::string_view text);

// The codes that one word of a source stands for: "P0101" itself, "P0101-P0105" the codes from the first to the last,
// counted in hexadecimal. Throws SourceError when the word is no code and no rising range of one system's codes.
std::vector<std::string> expandCodes(std::string_view word);

} // namespace catalogue
