#pragma once

#include <string>

namespace velmora {

// The text as HTML shows it: nothing in it is taken for a mark, in an attribute neither. What HTML has no form for is
// replaced: bytes that are no UTF-8, and control characters.
std::string escapedHtml(std::string const& text);

} // namespace velmora
