#pragma once

#include <string>

namespace velmora::cli {

// The QR code of a text, two of its rows in a line of block characters, dark on light whatever the terminal's colours
// are, with the quiet zone of four around it.
std::string qrText(std::string const& text);

// The same where that terminal can show it: with colours, UTF-8 and room enough. Empty elsewhere.
std::string qrForTerminal(std::string const& text, int terminal);

} // namespace velmora::cli
