#include "program/terminal/terminal.h"

#include "program/terminal/interrupt.h"
#include "program/terminal/screen.h"

#include <array>
#include <clocale>
#include <cstdlib>
#include <cstring>
#include <string_view>
#include <sys/ioctl.h>
#include <unistd.h>
#include <utility>

namespace velmora::cli {

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

// A locale that came along by SSH need not exist on this machine; its characters do.
void Terminal::useCharacters()
{
    if (speaksUtf8() && std::setlocale(LC_CTYPE, "") == nullptr) {
        std::setlocale(LC_CTYPE, "C.UTF-8");
    }
}

std::size_t Terminal::columnsOf(int descriptor)
{
    if (::isatty(descriptor) == 0) {
        return 0;
    }
    char const* const wish = std::getenv("COLUMNS");
    if (int const columns = wish != nullptr ? std::atoi(wish) : 0; columns > 0) {
        return static_cast<std::size_t>(columns);
    }
    winsize window{};
    return ::ioctl(descriptor, TIOCGWINSZ, &window) == 0 ? window.ws_col : 0;
}

std::vector<std::string> terminalKinds(std::string const& named)
{
    // Known to users of newer systems, and described in packages that a Debian need not have.
    static constexpr std::array<std::string_view, 8> newer = {"xterm-",  "alacritty", "foot",    "kitty",
                                                              "wezterm", "ghostty",   "contour", "rio"};
    std::vector<std::string> kinds = {named};
    for (std::string_view const each : newer) {
        if (named.starts_with(each)) {
            kinds.insert(kinds.end(), {"xterm-256color", "xterm"});
            break;
        }
    }
    return kinds;
}

std::unique_ptr<Terminal> Terminal::open(bool coloured)
{
    char const* const named = std::getenv("TERM");
    for (std::string const& kind : terminalKinds(named != nullptr ? named : "")) {
        auto screen = std::make_unique<TerminalScreen>(kind, coloured);
        if (screen->isOpen()) {
            return std::unique_ptr<Terminal>(new Terminal(std::move(screen)));
        }
    }
    return nullptr;
}

// Whoever ends the program at once is another thread, which may write but not touch the screen itself.
Terminal::Terminal(std::unique_ptr<TerminalScreen> screen)
    : m_screen(std::move(screen)), m_restore(m_screen->leaveText(), m_screen->before())
{
    Interrupt::instance().setLastAct([this] { m_restore.restore(); });
}

Terminal::~Terminal()
{
    Interrupt::instance().setLastAct(nullptr);
}

Terminal::Size Terminal::size() const
{
    auto const [columns, rows] = m_screen->size();
    return {columns, rows};
}

void Terminal::draw(std::string const& frame)
{
    m_screen->draw(frame);
}

std::optional<Key> Terminal::readKey()
{
    return m_screen->readKey();
}

} // namespace velmora::cli
