// The page of a terminal, by what a terminal is sent and what its keys send.
#include "program/terminal/fatalrestore.h"
#include "program/terminal/interrupt.h"
#include "program/terminal/screen.h"
#include "program/terminal/terminal.h"
#include "tests/program/terminal/terminalinput.h"

#include <gmock/gmock.h>

#include <cstdio>
#include <sys/ioctl.h>

namespace {

using namespace velmora::cli;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

// What a screen told and was told. Gathered first, and judged when the test's own output is back in its place.
struct Seen
{
    bool open = false;
    std::string shown;
    std::string leave;
    std::pair<std::size_t, std::size_t> size;
    std::pair<std::size_t, std::size_t> resized;
    std::pair<std::size_t, std::size_t> smallest;
    std::vector<int> keys;
    tcflag_t local = 0;
    tcflag_t localBefore = 0;
    tcflag_t localAfter = 0;
    bool signalsAsUsual = true;
    bool suspends = true;
    bool knowsBefore = false;
};

tcflag_t localFlags(PseudoTerminal const& terminal)
{
    termios state{};
    EXPECT_EQ(::tcgetattr(terminal.terminal(), &state), 0);
    return state.c_lflag;
}

Seen see(std::string const& kind, bool coloured, std::string const& frame, std::string const& typed)
{
    SignalsAsBefore const signals;
    Interrupt const interrupt;
    PseudoTerminal const terminal(40, 10);
    Seen seen;
    seen.localBefore = localFlags(terminal);
    std::fflush(stdout);
    Replaced const input(STDIN_FILENO, terminal.terminal());
    Replaced const output(STDOUT_FILENO, terminal.terminal());
    {
        TerminalScreen screen(kind, coloured);
        seen.open = screen.isOpen();
        if (!seen.open) {
            return seen;
        }
        seen.size = screen.size();
        seen.leave = screen.leaveText();
        seen.local = localFlags(terminal);
        screen.draw(frame);
        seen.shown = terminal.shown();
        terminal.type(typed);
        for (std::optional<Key> key = screen.readKey(); key; key = screen.readKey()) {
            seen.keys.push_back(static_cast<int>(*key));
        }
        for (winsize const& other : {winsize{12, 60, 0, 0}, {0, 50, 0, 0}, {11, 0, 0, 0}}) {
            ::ioctl(terminal.terminal(), TIOCSWINSZ, &other);
            seen.resized = screen.size(); // one that tells nothing changes nothing
        }
        seen.knowsBefore = screen.before() != nullptr && screen.before()->c_lflag == seen.localBefore;
        termios state{};
        ::tcgetattr(terminal.terminal(), &state);
        seen.suspends = state.c_cc[VSUSP] != _POSIX_VDISABLE;
        winsize const smallest{1, 1, 0, 0};
        ::ioctl(terminal.terminal(), TIOCSWINSZ, &smallest);
        seen.smallest = screen.size();
        for (int const each : {SIGWINCH, SIGTSTP, SIGINT, SIGTERM}) {
            struct sigaction action
            {};
            ::sigaction(each, nullptr, &action);
            seen.signalsAsUsual = seen.signalsAsUsual && action.sa_handler == SIG_DFL;
        }
    }
    seen.localAfter = localFlags(terminal);
    return seen;
}

TEST(TerminalScreen, DrawsLinesWithTheirLooks)
{
    std::string const frame =
        "\033[1mbold\033[0m end\n\033[2mdim\033[0m\n\033[7mmarked\033[0m\n\033[1;31mred\033[0m\nlast";
    Seen const seen = see("xterm", true, frame, "");
    ASSERT_TRUE(seen.open);
    EXPECT_EQ(seen.size, (std::pair<std::size_t, std::size_t>(40, 10)));
    EXPECT_EQ(seen.resized, (std::pair<std::size_t, std::size_t>(60, 12)));
    EXPECT_EQ(seen.smallest, (std::pair<std::size_t, std::size_t>(1, 1)));
    EXPECT_TRUE(seen.signalsAsUsual) << "they are the program's own business";
    EXPECT_FALSE(seen.suspends) << "Ctrl-Z would leave the page standing";
    EXPECT_TRUE(seen.knowsBefore);
    EXPECT_THAT(seen.shown, HasSubstr("\033[?1049h")) << "a page of its own";
    EXPECT_THAT(seen.shown, HasSubstr("\033[?25l")) << "without a cursor";
    EXPECT_THAT(seen.shown, HasSubstr("\033[0;1mbold"));
    EXPECT_THAT(seen.shown, HasSubstr("\033[0;2mdim"));
    EXPECT_THAT(seen.shown, HasSubstr("\033[0;7mmarked"));
    EXPECT_THAT(seen.shown, HasSubstr("\033[0;1m\033[31mred"));
    for (char const* const text : {" end", "last"}) {
        EXPECT_THAT(seen.shown, HasSubstr(text));
    }
    EXPECT_EQ(seen.local & (ICANON | ECHO), 0U) << "keys come singly and unshown";
    EXPECT_EQ(seen.localAfter, seen.localBefore);
}

TEST(TerminalScreen, HasColoursWhereTheyAreWished)
{
    EXPECT_THAT(see("xterm", false, "\033[1;31mred\033[0m", "").shown, HasSubstr("\033[0;1mred"));
    EXPECT_THAT(see("xterm", false, "\033[1;31mred\033[0m", "").shown, Not(HasSubstr("\033[31m")));
    EXPECT_THAT(see("vt100", true, "\033[1;31mred\033[0m", "").shown, Not(HasSubstr("\033[31m"))) << "it has none";
    EXPECT_THAT(see("xterm", true, "\033[30mblack\033[0m", "").shown, HasSubstr("\033[30mblack"));
    EXPECT_THAT(see("xterm", true, "\033[37mwhite\033[0m", "").shown, HasSubstr("\033[37mwhite"));
}

TEST(TerminalScreen, ReadsKeysAndLeavesOutTheRest)
{
    Seen const seen =
        see("xterm", false, "", "a\033OA\033OB\033OD\033OC\033[5~\033[6~\033OH\033OF\033[3~\r\xC3\xA4~\033OP@");
    auto const code = [](Key key) { return static_cast<int>(key); };
    EXPECT_THAT(seen.keys, ElementsAre('a', code(Key::Up), code(Key::Down), code(Key::Left), code(Key::Right),
                                       code(Key::PageUp), code(Key::PageDown), code(Key::Home), code(Key::End),
                                       code(Key::Delete), code(Key::Enter), '~', '@'))
        << "neither parts of characters nor function keys";
}

TEST(TerminalScreen, TellsHowToLeaveThePage)
{
    std::string const leave = see("xterm", false, "", "").leave;
    EXPECT_THAT(leave, StartsWith("\033(B\033[m"));
    EXPECT_THAT(leave, HasSubstr("\033[?25h")) << "the cursor";
    EXPECT_THAT(leave, HasSubstr("\033[?1l\033>")) << "the keypad";
    EXPECT_THAT(leave, HasSubstr("\033[?1049l")) << "the page";
    EXPECT_EQ(see("vt100", false, "", "").leave, "\033[m\017\033[?1l\033>")
        << "without the pauses that its description asks for";
    EXPECT_FALSE(see("nobody-knows", false, "", "").open);
}

// What a second Ctrl-C and a fault do before they end the program.
TEST(FatalRestore, WritesItsTextAndBringsTheTerminalBack)
{
    for (bool const known : {true, false}) {
        PseudoTerminal const terminal;
        termios before{};
        ::tcgetattr(terminal.terminal(), &before);
        tcflag_t const flags = before.c_lflag;
        tcflag_t after = 0;
        std::string shown;
        std::fflush(stdout);
        {
            Replaced const output(STDOUT_FILENO, terminal.terminal());
            FatalRestore const restore("bye", known ? &before : nullptr);
            termios raw = before;
            raw.c_lflag &= ~static_cast<tcflag_t>(ICANON | ECHO);
            ::tcsetattr(terminal.terminal(), TCSANOW, &raw);
            restore.restore();
            shown = terminal.shown();
            after = localFlags(terminal);
        }
        EXPECT_EQ(shown, "bye");
        EXPECT_EQ(after == flags, known) << "a state that could not be told is not made up";
    }
}

TEST(FatalRestore, IsDoneForEachSignalThatNothingElseAnswers)
{
    int const signals[] = {SIGQUIT, SIGSEGV, SIGABRT, SIGBUS, SIGILL, SIGFPE};
    auto const handlers = [&signals] {
        std::vector<sighandler_t> list;
        for (int const each : signals) {
            struct sigaction action
            {};
            EXPECT_EQ(::sigaction(each, nullptr, &action), 0);
            list.push_back(action.sa_handler);
        }
        return list;
    };
    std::vector<sighandler_t> const before = handlers();
    {
        FatalRestore const restore("", nullptr);
        std::vector<sighandler_t> const meanwhile = handlers();
        for (std::size_t i = 0; i < before.size(); ++i) {
            EXPECT_NE(meanwhile[i], before[i]) << signals[i];
            EXPECT_EQ(meanwhile[i], meanwhile[0]) << signals[i];
        }
    }
    EXPECT_EQ(handlers(), before);
}

} // namespace
