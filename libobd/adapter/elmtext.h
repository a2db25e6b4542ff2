#pragma once

#include <string>
#include <string_view>

namespace obd {

// Working on the adapter's replies. All searches are for the first occurrence of a plain text, case-sensitive. ASCII
// only: the process's locale plays no part.

// Removes word.
void cropWord(std::string_view word, std::string& text);

// Removes all that stands before word; word itself stays.
void cropBefore(std::string_view word, std::string& text);

bool hasResponse(std::string_view text, std::string_view word);

void removeSpaces(std::string& text);

std::string toUpper(std::string text);

// Makes a reply comparable: upper case, no blanks, without the command's echo and one "?".
void trim(std::string_view command, std::string& text);

// Without the white space at both ends.
std::string stripped(std::string_view text);

} // namespace obd
