#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace velmora {

// One record of a CSV text.
struct CsvRecord
{
    std::size_t line = 0; // on which it begins, from 1
    std::vector<std::string> cells;
};

// Cuts a text into records (RFC 4180): quoted cells, "" inside them, CR, LF or both at the ends of lines. Any text has
// some reading; a quote that is never closed runs to the end.
std::vector<CsvRecord> readCsv(std::string_view text);

// Whether the text is UTF-8.
bool isUtf8(std::string_view text);

// The UTF-8 of a text in ISO 8859-1.
std::string fromLatin1(std::string_view text);

} // namespace velmora
