#pragma once

#include <common/tracelogger.h>

#include <atomic>
#include <cstdio>
#include <string>

namespace tervex {

// Writes the log lines to a file, flushed line by line so that a crash loses none.
class DebugLogger : public TraceLogger
{
public:
    DebugLogger() = default;
    // Closes the file, and takes this logger out of LogSink if it stands there.
    ~DebugLogger() override;

    DebugLogger(DebugLogger const&) = delete;
    DebugLogger& operator=(DebugLogger const&) = delete;

    // Opens path for writing, truncating an old log (but not what standard output or standard error are redirected to),
    // and makes this logger the process's LogSink. A file that cannot be opened leaves logging off, silently. An empty
    // path changes neither the file nor whether logging is on. A file opened earlier is left open: another thread may
    // be writing to it.
    void open(std::string const& path);

    // Whether a line could not be written since open.
    bool failed() const { return m_failed; }

    // A failing write is only noted: logging never fails its caller.
    void write(std::string const& line) override;

private:
    std::atomic<std::FILE*> m_file{nullptr};
    std::atomic<bool> m_failed{false};
    std::string m_path;
};

} // namespace tervex
