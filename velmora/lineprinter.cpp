#include "velmora/lineprinter.h"

#include <cstdio>
#include <utility>

namespace velmora {

LinePrinter::LinePrinter() : m_thread([this] { run(); }) {}

LinePrinter::~LinePrinter()
{
    {
        std::lock_guard const lock(m_mutex);
        m_stop = true;
        m_wake.notify_one();
    }
    m_thread.join();
}

void LinePrinter::print(std::string const& line)
{
    std::lock_guard const lock(m_mutex);
    m_text += line;
    ++m_lines;
    m_wake.notify_one();
}

std::size_t LinePrinter::lines() const
{
    std::lock_guard const lock(m_mutex);
    return m_lines;
}

bool LinePrinter::readerGone() const
{
    std::lock_guard const lock(m_mutex);
    return m_readerGone;
}

void LinePrinter::run()
{
    std::unique_lock lock(m_mutex);
    while (!m_stop || !m_text.empty()) {
        m_wake.wait(lock, [this] { return m_stop || !m_text.empty(); });
        std::string const text = std::exchange(m_text, {});
        lock.unlock();
        bool const written =
            std::fwrite(text.data(), 1, text.size(), stdout) == text.size() && std::fflush(stdout) == 0;
        lock.lock();
        m_readerGone = m_readerGone || !written;
    }
}

} // namespace velmora
