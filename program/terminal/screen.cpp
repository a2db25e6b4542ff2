// The only file that includes ncurses.
#include "program/terminal/screen.h"

#include "program/terminal/spans.h"

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <string_view>
#include <sys/ioctl.h>
#include <unistd.h>

#define NCURSES_NOMACROS
#include <curses.h>
#include <term.h>

namespace velmora::cli {

namespace {

constexpr int splitLimitMs = 150; // how long the rest of a key's sequence may take on a slow link
constexpr int colors = 8;

struct KnownKey
{
    int code;
    Key key;
};

constexpr KnownKey knownKeys[] = {
    {KEY_UP, Key::Up},        {KEY_DOWN, Key::Down},   {KEY_LEFT, Key::Left},      {KEY_RIGHT, Key::Right},
    {KEY_PPAGE, Key::PageUp}, {KEY_HOME, Key::Home},   {KEY_NPAGE, Key::PageDown}, {KEY_END, Key::End},
    {KEY_DC, Key::Delete},    {KEY_ENTER, Key::Enter}, {'\r', Key::Enter},
};

std::optional<Key> keyOf(int code)
{
    for (KnownKey const& each : knownKeys) {
        if (each.code == code) {
            return each.key;
        }
    }
    // Bytes beyond are parts of characters, which no view asks for; codes beyond those are other keys.
    return code >= 0 && code < 0x80 ? std::optional(static_cast<Key>(code)) : std::nullopt;
}

// A capability without the pauses that only printing terminals needed: "$<50>".
std::string capability(char const* name)
{
    char const* const value = ::tigetstr(name);
    if (value == nullptr || value == reinterpret_cast<char const*>(-1)) {
        return {};
    }
    std::string text = value;
    for (std::size_t begin = text.find("$<"); begin != std::string::npos; begin = text.find("$<", begin)) {
        text.erase(begin, std::min(text.find('>', begin), text.size() - 1) - begin + 1);
    }
    return text;
}

// Asked for first: newterm loses memory over a kind that it doesn't know.
bool isKnown(std::string const& kind)
{
    int found = 0;
    if (::setupterm(kind.c_str(), STDOUT_FILENO, &found) != OK) {
        return false;
    }
    ::del_curterm(cur_term);
    return true;
}

attr_t attributesOf(SpanLook const& look, bool coloured)
{
    attr_t attributes = A_NORMAL;
    attributes |= look.bold ? A_BOLD : A_NORMAL;
    attributes |= look.dim ? A_DIM : A_NORMAL;
    attributes |= look.reverse ? A_REVERSE : A_NORMAL;
    if (coloured && look.color >= 0) {
        attributes |= static_cast<attr_t>(COLOR_PAIR(look.color + 1));
    }
    return attributes;
}

void startColors()
{
    ::start_color();
    ::use_default_colors();
    for (short color = 0; color < colors; ++color) {
        ::init_pair(static_cast<short>(color + 1), color, -1);
    }
}

// Signals are the program's own business: what asks it to end goes to a thread of its own, and a size is asked for when
// it is needed. A handler here would also break off the waiting of other threads.
void takeSignalsBack()
{
    for (int const each : {SIGWINCH, SIGTSTP, SIGINT, SIGTERM}) {
        std::signal(each, SIG_DFL);
    }
}

// Ctrl-Z would leave the page standing.
void disableSuspending()
{
    termios state{};
    if (::tcgetattr(STDOUT_FILENO, &state) == 0) {
        state.c_cc[VSUSP] = _POSIX_VDISABLE;
        ::tcsetattr(STDOUT_FILENO, TCSANOW, &state);
        ::def_prog_mode();
    }
}

} // namespace

struct TerminalScreen::Page
{
    explicit Page(SCREEN* opened) : screen(opened) {}
    ~Page()
    {
        ::endwin();
        ::delscreen(screen);
    }
    Page(Page const&) = delete;
    Page& operator=(Page const&) = delete;

    SCREEN* const screen;
};

TerminalScreen::TerminalScreen(std::string const& kind, bool coloured)
    : m_hasBefore(::tcgetattr(STDOUT_FILENO, &m_before) == 0), m_coloured(false), m_hasKeys(::isatty(STDIN_FILENO) != 0)
{
    SCREEN* const opened = isKnown(kind) ? ::newterm(kind.c_str(), stdout, stdin) : nullptr;
    if (opened == nullptr) {
        return;
    }
    m_page = std::make_unique<Page>(opened);
    takeSignalsBack();
    ::cbreak();
    ::noecho();
    ::nonl();
    ::curs_set(0);
    ::set_escdelay(splitLimitMs);
    ::keypad(stdscr, TRUE);
    ::nodelay(stdscr, TRUE);
    disableSuspending();
    m_coloured = coloured && ::has_colors();
    if (m_coloured) {
        startColors();
    }
}

TerminalScreen::~TerminalScreen() = default;

std::string TerminalScreen::leaveText() const
{
    return capability("sgr0") + capability("cnorm") + capability("rmkx") + capability("rmcup");
}

std::pair<std::size_t, std::size_t> TerminalScreen::size() const
{
    winsize window{};
    if (::ioctl(STDOUT_FILENO, TIOCGWINSZ, &window) == 0 && window.ws_col != 0 && window.ws_row != 0 &&
        ::is_term_resized(window.ws_row, window.ws_col)) {
        ::resizeterm(window.ws_row, window.ws_col);
    }
    return {static_cast<std::size_t>(::getmaxx(stdscr)), static_cast<std::size_t>(::getmaxy(stdscr))};
}

void TerminalScreen::draw(std::string const& frame)
{
    ::erase();
    std::string_view rest = frame;
    for (int row = 0; !rest.empty(); ++row) {
        std::string_view const line = rest.substr(0, rest.find('\n'));
        rest.remove_prefix(std::min(line.size() + 1, rest.size()));
        ::move(row, 0);
        for (Span const& span : spansOf(line)) {
            ::attrset(static_cast<NCURSES_ATTR_T>(attributesOf(span.look, m_coloured)));
            ::addstr(span.text.c_str());
        }
    }
    ::attrset(A_NORMAL);
    ::refresh();
}

std::optional<Key> TerminalScreen::readKey()
{
    while (m_hasKeys) {
        int const code = ::getch();
        if (code == ERR) {
            break;
        }
        if (std::optional<Key> const key = keyOf(code)) {
            return key;
        }
    }
    return std::nullopt;
}

} // namespace velmora::cli
