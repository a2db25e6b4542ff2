#pragma once

#include <string>

namespace tervex {

// Takes finished log messages. May be called from several threads at once.
class ITraceLogger
{
public:
    virtual ~ITraceLogger() = default;

    // file is the path from the root of the source tree, level a LogLevel.
    virtual void log(char const* file, int line, int level, std::string const& message) = 0;
};

} // namespace tervex
