#pragma once

#include <string>
#include <termios.h>

namespace velmora::cli {

// Leaves the terminal as it was when a signal ends the program that nothing else can answer: a fault, an abort, or the
// quit key. One at a time.
class FatalRestore
{
public:
    // text: what brings the screen back. before: the state of the terminal at standard output, or null.
    FatalRestore(std::string const& text, termios const* before);
    ~FatalRestore();
    FatalRestore(FatalRestore const&) = delete;
    FatalRestore& operator=(FatalRestore const&) = delete;

    // Does it now, and may be called on any thread.
    void restore() const;
};

} // namespace velmora::cli
