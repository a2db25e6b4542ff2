#include <common/debuglogger.h>
#include <common/logrecord.h>

#include <filesystem>

namespace tervex {

namespace {

// The stream that the user has redirected to this very file, which is therefore written on and never emptied; null for
// any other file.
std::FILE* redirectedTo(std::string const& path)
{
    std::error_code ignored;
    if (std::filesystem::is_regular_file(path, ignored)) {
        if (std::filesystem::equivalent(path, "/dev/stdout", ignored)) {
            return stdout;
        }
        if (std::filesystem::equivalent(path, "/dev/stderr", ignored)) {
            return stderr;
        }
    }
    return nullptr;
}

} // namespace

DebugLogger::~DebugLogger()
{
    ITraceLogger* self = this;
    LogSink.compare_exchange_strong(self, nullptr);
    std::FILE* file = m_file.exchange(nullptr);
    if (file != nullptr && file != stdout && file != stderr) {
        std::fclose(file);
    }
}

void DebugLogger::open(std::string const& path)
{
    m_path = path;
    m_failed = false;
    if (!path.empty()) {
        std::FILE* const stream = redirectedTo(path);
        std::FILE* file = stream != nullptr ? stream : std::fopen(path.c_str(), "w");
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
