#include <common/debuglogger.h>
#include <common/logrecord.h>

namespace tervex {

DebugLogger::~DebugLogger()
{
    ITraceLogger* self = this;
    LogSink.compare_exchange_strong(self, nullptr);
    if (std::FILE* file = m_file.exchange(nullptr)) {
        std::fclose(file);
    }
}

void DebugLogger::open(std::string const& path)
{
    m_path = path;
    if (!path.empty()) {
        std::FILE* file = std::fopen(path.c_str(), "w");
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
        std::fprintf(file, "%s", line.c_str());
        std::fflush(file);
    }
}

} // namespace tervex
