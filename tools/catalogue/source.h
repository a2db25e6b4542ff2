#pragma once

#include "tools/catalogue/sourceerror.h"
#include "tools/catalogue/textpattern.h"

#include <cstddef>
#include <istream>
#include <string>
#include <vector>

namespace catalogue {

// The longest text that the catalogue holds, in characters.
constexpr std::size_t maximumTextLength = 140;

// The longest code: five characters, or one more of a malformed one.
constexpr std::size_t maximumCodeLength = 6;

// One code with its text, as a source line gave it.
struct Row
{
    std::size_t maker = 0;
    std::string code;
    std::string text;
    bool repeat = false; // stands beside an earlier row of the same maker and code
    Place place;
};

// "same as": a maker takes over the rows of another one.
struct Twin
{
    std::size_t maker = 0;
    std::size_t original = 0;
    std::vector<std::string> exceptions; // codes that are not taken over
    Place place;
};

// All that the sources say, in the order in which it was read.
struct Source
{
    Lists sharedLists; // of files without a maker, for every file that is read later
    std::vector<Row> rows;
    std::vector<Twin> twins;
    std::vector<std::string> problems; // "file:line: message" for each line that was refused
};

// Reads one file into `source`. A line that is refused adds a problem and nothing else.
void readSource(std::istream& input, std::string const& file, Source& source);

} // namespace catalogue
