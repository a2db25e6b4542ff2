#include "program/terminal/linereader.h"
#include "tests/program/terminal/terminalinput.h"

#include <velmora/error.h>

namespace {

using velmora::cli::LineReader;

bool hasInput(int limitMs)
{
    pollfd input{STDIN_FILENO, POLLIN, 0};
    return ::poll(&input, 1, limitMs) > 0;
}

TEST(TerminalInput, ForgetsWhatWasTypedBeforeAQuestion)
{
    PseudoTerminal const terminal;
    Replaced const input(STDIN_FILENO, terminal.terminal());
    terminal.type("yes\n");
    ASSERT_TRUE(hasInput(5000));
    velmora::cli::dropTypedAhead();
    EXPECT_FALSE(hasInput(0));
    terminal.type("no\n");
    EXPECT_TRUE(hasInput(5000)) << "what is typed behind it counts";
}

class PipedInput : public testing::Test
{
protected:
    PipedInput()
    {
        EXPECT_EQ(::pipe(m_pipe), 0);
        m_input.emplace(STDIN_FILENO, m_pipe[0]);
        ::close(m_pipe[0]);
    }
    ~PipedInput() override { end(); }

    void write(std::string const& text) const
    {
        EXPECT_EQ(::write(m_pipe[1], text.data(), text.size()), static_cast<ssize_t>(text.size()));
    }
    void end()
    {
        if (m_pipe[1] >= 0) {
            ::close(m_pipe[1]);
        }
        m_pipe[1] = -1;
    }

private:
    int m_pipe[2] = {-1, -1};
    std::optional<Replaced> m_input;
};

TEST_F(PipedInput, ComesLineByLine)
{
    std::string const longer(1500, 'x');
    write("ATZ\n\n" + longer + "\nlast");
    end();
    int checks = 0;
    LineReader reader([&checks] { ++checks; });
    std::string line = "before";
    for (std::string const& each : {std::string("ATZ"), std::string(), longer, std::string("last")}) {
        EXPECT_TRUE(reader.read(line));
        EXPECT_EQ(line, each);
    }
    EXPECT_GE(checks, 4) << "before each part that is read";
    EXPECT_FALSE(reader.read(line)) << "the end of the input";
    EXPECT_EQ(line, "");
}

TEST_F(PipedInput, MayComeByteByByte)
{
    LineReader reader([] {});
    std::string line = "before";
    write("\n");
    EXPECT_TRUE(reader.read(line));
    EXPECT_EQ(line, "");
    write("A");
    end();
    EXPECT_TRUE(reader.read(line));
    EXPECT_EQ(line, "A");
    EXPECT_FALSE(reader.read(line));
}

TEST_F(PipedInput, IsNotAwaitedWhenTheProgramIsToEnd)
{
    int checks = 0;
    LineReader reader([&checks] {
        if (++checks == 2) {
            throw velmora::Error(velmora::ErrorKind::Interrupted, "Interrupted");
        }
    });
    std::string line;
    write("first\n");
    EXPECT_TRUE(reader.read(line));
    EXPECT_EQ(checks, 1);
    write("second\n");
    EXPECT_THROW(reader.read(line), velmora::Error) << "though there is a line";
}

TEST_F(PipedInput, IsAwaitedWithAnEyeOnTheEnd)
{
    int checks = 0;
    LineReader reader([&checks] {
        if (++checks == 2) {
            throw velmora::Error(velmora::ErrorKind::Interrupted, "Interrupted");
        }
    });
    std::string line;
    EXPECT_THROW(reader.read(line), velmora::Error) << "nobody writes, and nobody ends the input";
}

} // namespace
