#pragma once

#include <cstddef>
#include <stdexcept>
#include <string>

namespace catalogue {

// What is wrong with one line of a source; the reader adds the file and the line.
class SourceError : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

// Where something was written, for messages.
struct Place
{
    std::string file;
    std::size_t line = 0;
};

// "file:line", the form that editors jump to.
inline std::string toString(Place const& place)
{
    return place.file + ':' + std::to_string(place.line);
}

} // namespace catalogue
