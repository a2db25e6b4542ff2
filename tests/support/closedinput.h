#pragma once

#include <fcntl.h>
#include <unistd.h>

namespace testsupport {

// While it lives standard input is closed, as where a program was started without one: what is opened next is 0.
class ClosedInput
{
public:
    ClosedInput() : m_kept(::fcntl(STDIN_FILENO, F_DUPFD_CLOEXEC, 3)) { ::close(STDIN_FILENO); }
    ~ClosedInput()
    {
        if (m_kept >= 0) {
            ::dup2(m_kept, STDIN_FILENO);
            ::close(m_kept);
        }
    }
    ClosedInput(ClosedInput const&) = delete;
    ClosedInput& operator=(ClosedInput const&) = delete;

    // Nothing has taken its place, or has given it back.
    static bool isFree() { return ::fcntl(STDIN_FILENO, F_GETFD) < 0; }

private:
    int const m_kept;
};

} // namespace testsupport
