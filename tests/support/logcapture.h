#pragma once

#include <common/logrecord.h>

#include <algorithm>
#include <mutex>
#include <string>
#include <vector>

namespace support {

// Collects what is logged during its lifetime, as "LEVEL text", such as "ERROR Signature mismatch".
class LogCapture : public tervex::ITraceLogger
{
public:
    LogCapture() : m_previous(tervex::LogSink.exchange(this)) {}
    ~LogCapture() override { tervex::LogSink = m_previous; }
    LogCapture(LogCapture const&) = delete;
    LogCapture& operator=(LogCapture const&) = delete;

    void log(char const* /*file*/, int /*line*/, int level, std::string const& message) override
    {
        static constexpr char const* words[] = {"DEBUG ", "INFO ", "ERROR ", "FATAL "};
        std::lock_guard const lock(m_mutex);
        m_lines.push_back(words[level] + message);
    }

    std::vector<std::string> lines() const
    {
        std::lock_guard const lock(m_mutex);
        return m_lines;
    }

    bool contains(std::string const& line) const
    {
        std::vector<std::string> const all = lines();
        return std::find(all.begin(), all.end(), line) != all.end();
    }

    void clear()
    {
        std::lock_guard const lock(m_mutex);
        m_lines.clear();
    }

private:
    mutable std::mutex m_mutex;
    std::vector<std::string> m_lines;
    tervex::ITraceLogger* m_previous;
};

} // namespace support
