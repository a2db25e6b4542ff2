#pragma once

#include <condition_variable>
#include <exception>
#include <mutex>
#include <string>
#include <thread>

namespace velmora::cli {

// Prints to standard output on a thread of its own, so that a slow reader holds up nobody who hands in lines.
class LinePrinter
{
public:
    LinePrinter();
    // Prints what was handed in first.
    ~LinePrinter();
    LinePrinter(LinePrinter const&) = delete;
    LinePrinter& operator=(LinePrinter const&) = delete;

    // Queues one line, its end included. Any thread.
    void print(std::string const& line);

    // Prints what was handed in; nothing more may be. Throws Error if the output can't be written.
    void finish();

    // Whether nobody reads any more. Throws Error if the output can't be written. Any thread.
    bool readerGone() const;

private:
    void run();
    void stop();

    mutable std::mutex m_mutex;
    std::condition_variable m_wake;
    std::string m_text; // protected by m_mutex, as what follows
    bool m_readerGone = false;
    std::exception_ptr m_failure;
    bool m_stop = false;
    std::thread m_thread;
};

} // namespace velmora::cli
