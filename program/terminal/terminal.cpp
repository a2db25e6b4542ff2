#include "program/terminal/terminal.h"

#include "program/terminal/interrupt.h"

#include <cstdlib>
#include <cstring>
#include <sys/ioctl.h>
#include <unistd.h>

namespace velmora::cli {

namespace {

// A page of its own without cursor, and back.
constexpr char const* enterPage = "\033[?1049h\033[?25l\033[2J";
constexpr char const* leavePage = "\033[0m\033[?25h\033[?1049l";

void writeAll(std::string const& text)
{
    std::size_t written = 0;
    while (written < text.size()) {
        ssize_t const count = ::write(STDOUT_FILENO, text.data() + written, text.size() - written);
        if (count <= 0) {
            return; // a terminal that has gone shows nothing more
        }
        written += static_cast<std::size_t>(count);
    }
}

} // namespace

bool Terminal::isUsable()
{
    char const* const kind = std::getenv("TERM");
    return ::isatty(STDOUT_FILENO) != 0 && kind != nullptr && *kind != '\0' && std::strcmp(kind, "dumb") != 0;
}

bool Terminal::speaksUtf8()
{
    for (char const* const name : {"LC_ALL", "LC_CTYPE", "LANG"}) {
        char const* const value = std::getenv(name);
        if (value != nullptr && *value != '\0') {
            return ::strcasestr(value, "UTF-8") != nullptr || ::strcasestr(value, "UTF8") != nullptr;
        }
    }
    return false;
}

std::size_t Terminal::columnsOf(int descriptor)
{
    winsize window{};
    return ::isatty(descriptor) != 0 && ::ioctl(descriptor, TIOCGWINSZ, &window) == 0 ? window.ws_col : 0;
}

Terminal::Terminal() : m_restore(leavePage, m_keys.before())
{
    Interrupt::instance().setLastAct([this] { leave(); });
    m_inside = true;
    writeAll(enterPage);
}

Terminal::~Terminal()
{
    Interrupt::instance().setLastAct(nullptr);
    leave();
}

void Terminal::leave()
{
    if (m_inside) {
        writeAll(leavePage);
    }
    m_keys.restore();
    m_inside = false;
}

Terminal::Size Terminal::size() const
{
    winsize window{};
    if (::ioctl(STDOUT_FILENO, TIOCGWINSZ, &window) != 0 || window.ws_col == 0 || window.ws_row == 0) {
        return {80, 24};
    }
    return {window.ws_col, window.ws_row};
}

void Terminal::draw(std::string const& frame)
{
    std::string text = "\033[H";
    std::size_t begin = 0;
    while (begin < frame.size()) {
        std::size_t const end = std::min(frame.find('\n', begin), frame.size());
        text += (begin == 0 ? "" : "\r\n") + frame.substr(begin, end - begin) + "\033[K";
        begin = end + 1;
    }
    writeAll(text + "\033[J");
}

std::optional<Key> Terminal::readKey()
{
    return m_keys.read(std::chrono::milliseconds(0));
}

} // namespace velmora::cli
