#include <common/logrecord.h>

#include <locale>

namespace tervex {

std::atomic<ITraceLogger*> LogSink{nullptr};

LogRecord::LogRecord(char const* file, int line, int level) : m_file(file), m_line(line), m_level(level)
{
    imbue(std::locale::classic());
}

LogRecord::~LogRecord()
{
    try {
        if (ITraceLogger* sink = LogSink) {
            sink->log(m_file, m_line, m_level, str());
        }
    } catch (...) {
        // A message that cannot be built or written is lost; its caller goes on.
        return;
    }
}

} // namespace tervex
