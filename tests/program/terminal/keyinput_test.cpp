#include "program/terminal/keyinput.h"
#include "tests/program/terminal/terminalinput.h"

namespace {

using std::chrono::milliseconds;
using velmora::cli::Key;
using velmora::cli::KeyInput;

constexpr milliseconds patience{5000};

termios stateOf(int terminal)
{
    termios state{};
    EXPECT_EQ(::tcgetattr(terminal, &state), 0);
    return state;
}

TEST(KeyInput, TakesKeysSinglyAndLeavesTheTerminalAsItWas)
{
    PseudoTerminal const terminal;
    Replaced const input(STDIN_FILENO, terminal.terminal());
    termios before = stateOf(terminal.terminal());
    before.c_cc[VMIN] = 3;
    before.c_cc[VTIME] = 7;
    EXPECT_EQ(::tcsetattr(terminal.terminal(), TCSANOW, &before), 0);
    {
        KeyInput const keys;
        termios const raw = stateOf(terminal.terminal());
        EXPECT_EQ(raw.c_lflag, before.c_lflag & ~static_cast<tcflag_t>(ICANON | ECHO)) << "Ctrl-C still interrupts";
        EXPECT_EQ(raw.c_cc[VMIN], 0);
        EXPECT_EQ(raw.c_cc[VTIME], 0);
        EXPECT_EQ(raw.c_cc[VSUSP], _POSIX_VDISABLE);
        ASSERT_NE(keys.before(), nullptr);
        EXPECT_EQ(keys.before()->c_lflag, before.c_lflag);
        keys.restore();
        EXPECT_EQ(stateOf(terminal.terminal()).c_lflag, before.c_lflag);
        EXPECT_EQ(stateOf(terminal.terminal()).c_cc[VSUSP], before.c_cc[VSUSP]);
    }
    {
        KeyInput const keys;
    }
    EXPECT_EQ(stateOf(terminal.terminal()).c_lflag, before.c_lflag);
}

TEST(KeyInput, GivesOneKeyAtATime)
{
    PseudoTerminal const terminal;
    Replaced const input(STDIN_FILENO, terminal.terminal());
    KeyInput keys;
    EXPECT_EQ(keys.read(milliseconds(0)), std::nullopt);
    terminal.type("ab\033[A");
    EXPECT_EQ(keys.read(patience), static_cast<Key>('a'));
    EXPECT_EQ(keys.read(milliseconds(0)), static_cast<Key>('b')) << "it came with the first";
    EXPECT_EQ(keys.read(milliseconds(0)), Key::Up);
    EXPECT_EQ(keys.read(milliseconds(0)), std::nullopt);
    EXPECT_FALSE(keys.ended());
}

TEST(KeyInput, WaitsForTheRestOfASequenceButNotLong)
{
    PseudoTerminal const terminal;
    Replaced const input(STDIN_FILENO, terminal.terminal());
    KeyInput keys;
    terminal.type("\033");
    EXPECT_EQ(keys.read(patience), std::nullopt) << "more may come";
    terminal.type("[A");
    EXPECT_EQ(keys.read(patience), Key::Up);
    terminal.type("\033");
    auto const start = std::chrono::steady_clock::now();
    std::optional<Key> key;
    while (!key) {
        key = keys.read(patience);
    }
    auto const waited = std::chrono::steady_clock::now() - start;
    EXPECT_EQ(key, Key::Escape) << "nothing came";
    EXPECT_GE(waited, milliseconds(100));
    EXPECT_LT(waited, patience / 2);
}

TEST(KeyInput, EndsWithItsTerminal)
{
    PseudoTerminal terminal;
    Replaced const input(STDIN_FILENO, terminal.terminal());
    KeyInput keys;
    terminal.type("q");
    EXPECT_EQ(keys.read(patience), static_cast<Key>('q'));
    EXPECT_FALSE(keys.ended());
    terminal.hangUp();
    EXPECT_EQ(keys.read(patience), std::nullopt);
    EXPECT_TRUE(keys.ended());
}

TEST(KeyInput, HasNoKeysWithoutATerminal)
{
    int ends[2];
    ASSERT_EQ(::pipe(ends), 0);
    EXPECT_EQ(::write(ends[1], "q", 1), 1);
    {
        Replaced const input(STDIN_FILENO, ends[0]);
        KeyInput keys;
        EXPECT_EQ(keys.before(), nullptr);
        EXPECT_EQ(keys.read(patience), std::nullopt);
        EXPECT_FALSE(keys.ended());
    }
    ::close(ends[0]);
    ::close(ends[1]);
}

} // namespace
