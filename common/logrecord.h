#pragma once

#include <common/itracelogger.h>
#include <common/loglevel.h>

#include <atomic>
#include <sstream>

namespace tervex {

// Where finished records go; null drops them. The logger it points to outlives its stay here.
extern std::atomic<ITraceLogger*> LogSink;

// One log message, made on the stack at its place and handed to LogSink when it ends. Formats in the classic locale.
// Ending a record never throws.
class LogRecord : public std::ostringstream
{
public:
    // file is kept as a pointer and must outlive the record.
    LogRecord(char const* file, int line, int level);
    ~LogRecord() override;

private:
    char const* m_file;
    int m_line;
    int m_level;
};

} // namespace tervex

// Starts a record of this place: TERVEX_LOG(Error) << "Not enough data";
#define TERVEX_LOG(level) ::tervex::LogRecord(__FILE__, __LINE__, static_cast<int>(::tervex::LogLevel::level))
