#include "velmora/terminal.h"

#include "velmora/interrupt.h"

#include <cstdlib>
#include <cstring>
#include <poll.h>
#include <sys/ioctl.h>
#include <unistd.h>

namespace velmora {

namespace {

// A page of its own without cursor, and back.
constexpr char const* enterPage = "\033[?1049h\033[?25l\033[2J";
constexpr char const* leavePage = "\033[?25h\033[?1049l";

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

struct Sequence
{
    char const* bytes;
    Key key;
};

constexpr Sequence sequences[] = {
    {"\033[A", Key::Up},   {"\033[B", Key::Down},    {"\033OA", Key::Up},
    {"\033OB", Key::Down}, {"\033[5~", Key::PageUp}, {"\033[6~", Key::PageDown},
};

// The length of a control sequence: it ends with the first letter or tilde behind its introducer.
std::size_t sequenceLength(std::string const& bytes)
{
    for (std::size_t i = 2; i < bytes.size(); ++i) {
        if (bytes[i] >= '@' && bytes[i] <= '~') {
            return i + 1;
        }
    }
    return bytes.size();
}

std::optional<Key> takeSequence(std::string& bytes)
{
    if (bytes.size() == 1 || (bytes[1] != '[' && bytes[1] != 'O')) {
        bytes.erase(0, 1);
        return Key::Escape;
    }
    std::string const sequence = bytes.substr(0, sequenceLength(bytes));
    bytes.erase(0, sequence.size());
    for (Sequence const& each : sequences) {
        if (sequence == each.bytes) {
            return each.key;
        }
    }
    return std::nullopt;
}

} // namespace

std::optional<Key> takeKey(std::string& bytes)
{
    while (!bytes.empty()) {
        if (bytes.front() != '\033') {
            char const byte = bytes.front();
            bytes.erase(0, 1);
            return byte == '\r' ? Key::Enter : static_cast<Key>(static_cast<unsigned char>(byte));
        }
        if (std::optional<Key> const key = takeSequence(bytes)) {
            return key;
        }
    }
    return std::nullopt;
}

bool Terminal::isUsable()
{
    char const* const kind = std::getenv("TERM");
    return ::isatty(STDOUT_FILENO) != 0 && kind != nullptr && *kind != '\0' && std::strcmp(kind, "dumb") != 0;
}

Terminal::Terminal() : m_hasKeys(::isatty(STDIN_FILENO) != 0 && ::tcgetattr(STDIN_FILENO, &m_before) == 0)
{
    Interrupt::instance().setLastAct([this] { leave(); });
    enter();
}

Terminal::~Terminal()
{
    Interrupt::instance().setLastAct(nullptr);
    leave();
}

void Terminal::enter()
{
    if (m_hasKeys) {
        termios raw = m_before;
        raw.c_lflag &= ~static_cast<tcflag_t>(ICANON | ECHO);
        raw.c_cc[VMIN] = 0;
        raw.c_cc[VTIME] = 0;
        raw.c_cc[VSUSP] = _POSIX_VDISABLE;
        ::tcsetattr(STDIN_FILENO, TCSANOW, &raw);
    }
    m_inside = true;
    writeAll(enterPage);
}

void Terminal::leave()
{
    if (m_inside) {
        writeAll(leavePage);
    }
    if (m_hasKeys) {
        ::tcsetattr(STDIN_FILENO, TCSANOW, &m_before);
    }
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
    pollfd input{STDIN_FILENO, POLLIN, 0};
    if (m_hasKeys && ::poll(&input, 1, 0) > 0) {
        char bytes[64];
        ssize_t const count = ::read(STDIN_FILENO, bytes, sizeof bytes);
        if (count > 0) {
            m_input.append(bytes, static_cast<std::size_t>(count));
        }
    }
    return takeKey(m_input);
}

} // namespace velmora
