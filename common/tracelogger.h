#pragma once

#include <common/itracelogger.h>

#include <atomic>

namespace tervex {

// Lays a message out as one line:
//   2024-03-07 09:05:02 11640 INFO - Lib OBD init
// local time, the calling thread's id, the level's word, the message, a line feed.
class TraceLogger : public ITraceLogger
{
public:
    // Does nothing, and reads no clock, while the logger is not enabled.
    void log(char const* file, int line, int level, std::string const& message) override;

    // Takes one finished line with its line feed. Must keep it whole when several threads write.
    virtual void write(std::string const& line) = 0;

protected:
    std::atomic<bool> m_enabled{false};
};

} // namespace tervex
