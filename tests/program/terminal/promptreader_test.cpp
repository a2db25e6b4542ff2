// What the prompt draws and gives, and which ends of the program are terminals to it.
#include "program/terminal/interrupt.h"
#include "program/terminal/promptreader.h"
#include "program/terminal/terminal.h"
#include "tests/program/terminal/terminalinput.h"

#include <velmora/error.h>

#include <fcntl.h>

namespace {

using namespace velmora;
using namespace velmora::cli;

class Prompt : public testing::Test
{
protected:
    struct Line
    {
        bool entered;
        std::string text;
        std::string drawn;
    };

    Line read(PromptReader& reader, std::string const& typed)
    {
        m_terminal.type(typed);
        std::string line;
        testing::internal::CaptureStderr();
        bool const entered = reader.read(line);
        return {entered, line, testing::internal::GetCapturedStderr()};
    }

    SignalsAsBefore const m_signals;
    Interrupt const m_interrupt;
    PseudoTerminal m_terminal;
    Replaced const m_input{STDIN_FILENO, m_terminal.terminal()};
};

TEST_F(Prompt, DrawsTheLineAnewWithEachKey)
{
    PromptReader reader([] {});
    Line const first = read(reader, "AX\033[D\033[3~T\n");
    EXPECT_TRUE(first.entered);
    EXPECT_EQ(first.text, "AT");
    EXPECT_EQ(first.drawn, "\r> \033[K"
                           "\r> A\033[K"
                           "\r> AX\033[K"
                           "\r> AX\033[K\033[1D"
                           "\r> A\033[K"
                           "\r> AT\033[K\n");
    Line const again = read(reader, "\033[A\033[H\n");
    EXPECT_EQ(again.text, "AT") << "the line before";
    EXPECT_EQ(again.drawn, "\r> \033[K\r> AT\033[K\r> AT\033[K\033[2D\n");
    Line const end = read(reader, "\x04");
    EXPECT_FALSE(end.entered);
    EXPECT_EQ(end.drawn, "\r> \033[K\n");
}

TEST_F(Prompt, EndsWithItsTerminal)
{
    PromptReader reader([] {});
    m_terminal.type("A");
    m_terminal.hangUp();
    std::string line;
    testing::internal::CaptureStderr();
    EXPECT_FALSE(reader.read(line));
    testing::internal::GetCapturedStderr();
}

TEST_F(Prompt, GivesWayToWhatEndsTheProgram)
{
    PromptReader reader([] { throw Error(ErrorKind::Interrupted, "Interrupted"); });
    std::string line = "as before";
    testing::internal::CaptureStderr();
    EXPECT_THROW(reader.read(line), Error);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "\r> \033[K\n") << "what is told next has a line of its own";
    EXPECT_EQ(line, "as before");
}

TEST(Terminals, AreThoseThatTheCursorCanBeMovedOn)
{
    PseudoTerminal const terminal;
    int const null = ::open("/dev/null", O_RDWR);
    Variable const kind("TERM");
    for (char const* const name : {"xterm", "dumb", "", static_cast<char const*>(nullptr)}) {
        kind.set(name);
        bool const good = name != nullptr && std::string(name) == "xterm";
        for (int const standard : {terminal.terminal(), null}) {
            bool const isTerminal = standard != null;
            Replaced const error(STDERR_FILENO, standard);
            EXPECT_EQ(PromptReader::canRedraw(), good && isTerminal) << name;
            for (int const typedAt : {terminal.terminal(), null}) {
                Replaced const input(STDIN_FILENO, typedAt);
                EXPECT_EQ(PromptReader::isUsable(), good && isTerminal && typedAt != null) << name;
            }
            std::fflush(stdout);
            bool usable = false;
            {
                Replaced const output(STDOUT_FILENO, standard);
                usable = Terminal::isUsable();
            }
            EXPECT_EQ(usable, good && isTerminal) << name;
        }
    }
    ::close(null);
}

TEST(Terminals, HaveColumnsByWishOrSize)
{
    PseudoTerminal const terminal(77, 12);
    Variable const wish("COLUMNS");
    struct Wish
    {
        char const* columns;
        std::size_t told;
    };
    for (Wish const& each : {Wish{nullptr, 77}, {"", 77}, {"0", 77}, {"-5", 77}, {"x", 77}, {"1", 1}, {"120", 120}}) {
        wish.set(each.columns);
        EXPECT_EQ(Terminal::columnsOf(terminal.terminal()), each.told) << each.told;
        int ends[2];
        ASSERT_EQ(::pipe(ends), 0);
        EXPECT_EQ(Terminal::columnsOf(ends[1]), 0U) << "no terminal";
        ::close(ends[0]);
        ::close(ends[1]);
    }
}

TEST(Terminals, SpeakUtf8ByTheFirstVariableThatSaysAnything)
{
    Variable const all("LC_ALL");
    Variable const characters("LC_CTYPE");
    Variable const language("LANG");
    struct Words
    {
        char const* all;
        char const* characters;
        char const* language;
        bool utf8;
    };
    for (Words const& each : {Words{"C.UTF-8", "C", "C", true},
                              {"C", "C.UTF-8", "C.UTF-8", false},
                              {"", "de_DE.utf8", "C", true},
                              {nullptr, "POSIX", "C.UTF-8", false},
                              {nullptr, nullptr, "en_GB.Utf-8", true},
                              {nullptr, "", "de_DE.ISO-8859-1", false},
                              {nullptr, nullptr, nullptr, false}}) {
        all.set(each.all);
        characters.set(each.characters);
        language.set(each.language);
        EXPECT_EQ(Terminal::speaksUtf8(), each.utf8);
    }
}

} // namespace
