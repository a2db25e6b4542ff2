#include "program/terminal/linereader.h"

#include <iterator>
#include <poll.h>
#include <termios.h>
#include <unistd.h>
#include <utility>

namespace velmora::cli {

namespace {

constexpr int lookMs = 100; // how often is looked whether the waiting is over

} // namespace

bool LineReader::read(std::string& line)
{
    while (true) {
        std::size_t const end = m_buffer.find('\n');
        if (end != std::string::npos) {
            line = m_buffer.substr(0, end);
            m_buffer.erase(0, end + 1);
            return true;
        }
        if (!fill()) {
            line = std::exchange(m_buffer, {});
            return !line.empty();
        }
    }
}

bool LineReader::fill()
{
    pollfd input[] = {{STDIN_FILENO, POLLIN, 0}};
    while (::poll(input, std::size(input), lookMs) <= 0) {
        m_check();
    }
    m_check();
    char bytes[512];
    ssize_t const count = ::read(STDIN_FILENO, bytes, sizeof bytes);
    if (count > 0) {
        m_buffer.append(bytes, static_cast<std::size_t>(count));
    }
    return count > 0;
}

void dropTypedAhead()
{
    ::tcflush(STDIN_FILENO, TCIFLUSH);
}

} // namespace velmora::cli
