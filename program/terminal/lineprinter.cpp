#include "program/terminal/lineprinter.h"

#include "program/terminal/output.h"

#include <utility>

namespace velmora::cli {

LinePrinter::LinePrinter() : m_thread([this] { run(); }) {}

LinePrinter::~LinePrinter()
{
    stop();
}

void LinePrinter::stop()
{
    {
        std::lock_guard const lock(m_mutex);
        m_stop = true;
        m_wake.notify_one();
    }
    if (m_thread.joinable()) {
        m_thread.join();
    }
}

void LinePrinter::finish()
{
    stop();
    readerGone();
}

void LinePrinter::print(std::string const& line)
{
    std::lock_guard const lock(m_mutex);
    m_text += line;
    m_wake.notify_one();
}

bool LinePrinter::readerGone() const
{
    std::lock_guard const lock(m_mutex);
    if (m_failure != nullptr) {
        std::rethrow_exception(m_failure);
    }
    return m_readerGone;
}

void LinePrinter::run()
{
    std::unique_lock lock(m_mutex);
    while (!m_stop || !m_text.empty()) {
        m_wake.wait(lock, [this] { return m_stop || !m_text.empty(); });
        std::string const text = std::exchange(m_text, {});
        lock.unlock();
        bool written = false;
        std::exception_ptr failure;
        try {
            written = writeOutput(text);
        } catch (Error const&) {
            failure = std::current_exception();
        }
        lock.lock();
        m_readerGone = m_readerGone || !written;
        m_failure = failure != nullptr ? failure : m_failure;
    }
}

} // namespace velmora::cli
