#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace velmora {

// ASCII letters only.
std::string toUpper(std::string text);

// A hexadecimal number, with or without 0x. Nothing for any other text or a number above the highest.
std::optional<unsigned int> parseHex(std::string const& text, unsigned int highest);

// The whole text as a finite number in decimal; nothing for any other text.
std::optional<double> numberIn(std::string const& text);

// What an adapter sent, line by line: without line ends, empty lines and the zero bytes that some slip in.
std::vector<std::string> adapterLines(std::string const& text);

// The parts between blanks, '_' and '-'.
std::vector<std::string> splitWords(std::string const& text);

// What an adapter or a vehicle said, for people: each control character, and each byte that is no UTF-8, becomes
// U+FFFD.
std::string readable(std::string const& text);

// How many columns of a terminal a UTF-8 text takes: two for wide characters, none for those that join the one before.
// The same in every locale.
std::size_t displayWidth(std::string_view text);

// How many bytes of it fill that many columns at most; what joins the last character goes with it.
std::size_t bytesOfWidth(std::string_view text, std::size_t width);

// The text in exactly that many columns: filled with blanks, at the left for rightAligned, or cut with an ellipsis.
std::string fitted(std::string const& text, std::size_t width, bool rightAligned = false);

// What is printable in an adapter's reply, in one line: each run of other bytes becomes a blank, and none stands at
// either end.
std::string printableLine(std::string_view reply);

// A cell of a CSV table: quoted when a reader of such needs it.
std::string csvField(std::string const& text);

// How many letters have to be typed, left out or changed to make one text of the other.
std::size_t editDistance(std::string const& left, std::string const& right);

} // namespace velmora
