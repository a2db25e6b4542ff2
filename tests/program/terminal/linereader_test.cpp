#include "program/terminal/linereader.h"

#include <gtest/gtest.h>

#include <poll.h>
#include <pty.h>
#include <unistd.h>

namespace {

// A terminal in the place of standard input.
class TerminalInput : public testing::Test
{
protected:
    TerminalInput() : m_before(::dup(STDIN_FILENO))
    {
        EXPECT_EQ(::openpty(&m_keyboard, &m_terminal, nullptr, nullptr, nullptr), 0);
        ::dup2(m_terminal, STDIN_FILENO);
    }
    ~TerminalInput() override
    {
        ::dup2(m_before, STDIN_FILENO);
        for (int const descriptor : {m_before, m_terminal, m_keyboard}) {
            ::close(descriptor);
        }
    }

    void type(std::string const& text) const
    {
        EXPECT_EQ(::write(m_keyboard, text.data(), text.size()), static_cast<ssize_t>(text.size()));
    }
    static bool hasInput(int limitMs)
    {
        pollfd input{STDIN_FILENO, POLLIN, 0};
        return ::poll(&input, 1, limitMs) > 0;
    }

    int m_before;
    int m_keyboard = -1;
    int m_terminal = -1;
};

TEST_F(TerminalInput, ForgetsWhatWasTypedBeforeAQuestion)
{
    type("yes\n");
    ASSERT_TRUE(hasInput(5000));
    velmora::cli::dropTypedAhead();
    EXPECT_FALSE(hasInput(0));
    type("no\n");
    EXPECT_TRUE(hasInput(5000)) << "what is typed behind it counts";
}

} // namespace
