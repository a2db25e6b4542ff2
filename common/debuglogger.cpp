#include <common/debuglogger.h>
#include <common/logrecord.h>
#include <common/outputfile.h>

namespace tervex {

DebugLogger::~DebugLogger()
{
    ITraceLogger* self = this;
    LogSink.compare_exchange_strong(self, nullptr);
    closeWritten(m_file.exchange(nullptr));
}

void DebugLogger::open(std::string const& path)
{
    m_path = path;
    m_failed = false;
    if (!path.empty()) {
        std::FILE* const file = openForWriting(path);
        if (file != nullptr) {
            m_file = file;
        }
        m_enabled = file != nullptr;
    }
    LogSink = this;
}

void DebugLogger::write(std::string const& line)
{
    if (std::FILE* file = m_file) {
        bool const written = std::fputs(line.c_str(), file) >= 0;
        if (std::fflush(file) != 0 || !written) {
            m_failed = true;
        }
    }
}

} // namespace tervex
