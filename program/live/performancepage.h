#pragma once

#include "program/view/framestyle.h"

#include <velmora/live.h>

#include <string>

namespace velmora::cli {

// Timed runs of one vehicle while its speed and engine speed alone are read.
class PerformancePage
{
public:
    // reader must outlive it, and time runs.
    explicit PerformancePage(LiveReader const& reader);

    std::string draw(std::string const& note, FrameStyle const& style) const;
    // Writes the run to a file of the user's, and tells which.
    std::string save() const;

private:
    LiveReader const& m_reader;
    bool const m_imperial;
};

} // namespace velmora::cli
