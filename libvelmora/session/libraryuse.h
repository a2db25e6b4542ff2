#pragma once

#include <string>

namespace velmora {

// The library, open for as long as any such object lives. Any thread.
class LibraryUse
{
public:
    // Throws Error if the log file can't be written. Empty for no log, or for the one that another use has begun.
    explicit LibraryUse(std::string const& logFile);
    ~LibraryUse();
    LibraryUse(LibraryUse const&) = delete;
    LibraryUse& operator=(LibraryUse const&) = delete;
};

} // namespace velmora
