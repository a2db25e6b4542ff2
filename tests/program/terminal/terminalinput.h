#pragma once

#include <gtest/gtest.h>

#include <csignal>
#include <cstdlib>
#include <optional>
#include <poll.h>
#include <pty.h>
#include <string>
#include <unistd.h>

// A terminal, or any other file, in the place of one of the three standard descriptors.
class Replaced
{
public:
    Replaced(int standard, int by) : m_standard(standard), m_before(::dup(standard)) { ::dup2(by, standard); }
    ~Replaced()
    {
        ::dup2(m_before, m_standard);
        ::close(m_before);
    }
    Replaced(Replaced const&) = delete;
    Replaced& operator=(Replaced const&) = delete;

private:
    int m_standard;
    int m_before;
};

// A pseudo-terminal, with the keyboard and the glass in the hands of the test.
class PseudoTerminal
{
public:
    explicit PseudoTerminal(unsigned short columns = 80, unsigned short rows = 24)
    {
        winsize const size{rows, columns, 0, 0};
        EXPECT_EQ(::openpty(&m_keyboard, &m_terminal, nullptr, nullptr, &size), 0);
    }
    ~PseudoTerminal()
    {
        hangUp();
        ::close(m_terminal);
    }
    PseudoTerminal(PseudoTerminal const&) = delete;
    PseudoTerminal& operator=(PseudoTerminal const&) = delete;

    int terminal() const { return m_terminal; }

    void type(std::string const& text) const
    {
        EXPECT_EQ(::write(m_keyboard, text.data(), text.size()), static_cast<ssize_t>(text.size()));
    }
    void hangUp()
    {
        if (m_keyboard >= 0) {
            ::close(m_keyboard);
        }
        m_keyboard = -1;
    }
    // Whether anything is written to it within a time.
    bool hasOutput(int milliseconds) const
    {
        pollfd output{m_keyboard, POLLIN, 0};
        return ::poll(&output, 1, milliseconds) > 0;
    }
    // What was written to the terminal up to now.
    std::string shown() const
    {
        std::string text;
        pollfd output{m_keyboard, POLLIN, 0};
        char bytes[4096];
        while (::poll(&output, 1, 0) > 0) {
            ssize_t const count = ::read(m_keyboard, bytes, sizeof bytes);
            if (count <= 0) {
                break;
            }
            text.append(bytes, static_cast<std::size_t>(count));
        }
        return text;
    }

private:
    int m_keyboard = -1;
    int m_terminal = -1;
};

// An environment variable as a test wants it, and as before behind it.
class Variable
{
public:
    explicit Variable(char const* name) : m_name(name)
    {
        char const* const value = std::getenv(name);
        m_before = value != nullptr ? std::optional<std::string>(value) : std::nullopt;
    }
    ~Variable() { set(m_before ? m_before->c_str() : nullptr); }
    Variable(Variable const&) = delete;
    Variable& operator=(Variable const&) = delete;

    void set(char const* value) const { value != nullptr ? ::setenv(m_name, value, 1) : ::unsetenv(m_name); }

private:
    char const* m_name;
    std::optional<std::string> m_before;
};

// Signals are blocked by who waits for them on a thread of its own; other tests want them as they were.
class SignalsAsBefore
{
public:
    SignalsAsBefore() : m_pipe(std::signal(SIGPIPE, SIG_DFL)) { pthread_sigmask(SIG_SETMASK, nullptr, &m_before); }
    ~SignalsAsBefore()
    {
        pthread_sigmask(SIG_SETMASK, &m_before, nullptr);
        std::signal(SIGPIPE, m_pipe);
    }
    SignalsAsBefore(SignalsAsBefore const&) = delete;
    SignalsAsBefore& operator=(SignalsAsBefore const&) = delete;

private:
    sigset_t m_before{};
    void (*m_pipe)(int);
};
