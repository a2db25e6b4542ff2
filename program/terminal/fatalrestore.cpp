#include "program/terminal/fatalrestore.h"

#include <array>
#include <csignal>
#include <unistd.h>

namespace velmora::cli {

namespace {

struct FatalSignal
{
    int const number;
    struct sigaction before
    {};
};

FatalSignal fatalSignals[] = {{SIGQUIT}, {SIGSEGV}, {SIGABRT}, {SIGBUS}, {SIGILL}, {SIGFPE}};

// What a handler may use: set before it is installed, and left alone as long as it is.
struct Kept
{
    std::array<char, 128> text{};
    std::size_t length = 0;
    termios before{};
    bool hasBefore = false;
};

Kept kept;

void bringBack()
{
    [[maybe_unused]] ssize_t const ignored = ::write(STDOUT_FILENO, kept.text.data(), kept.length);
    if (kept.hasBefore) {
        ::tcsetattr(STDOUT_FILENO, TCSANOW, &kept.before);
    }
}

void restoreAndEnd(int number)
{
    bringBack();
    std::signal(number, SIG_DFL);
    std::raise(number);
}

} // namespace

FatalRestore::FatalRestore(std::string const& text, termios const* before)
{
    kept.length = text.copy(kept.text.data(), kept.text.size());
    kept.hasBefore = before != nullptr;
    if (before != nullptr) {
        kept.before = *before;
    }
    struct sigaction action
    {};
    action.sa_handler = restoreAndEnd;
    sigemptyset(&action.sa_mask);
    for (FatalSignal& each : fatalSignals) {
        ::sigaction(each.number, &action, &each.before);
    }
}

void FatalRestore::restore() const
{
    bringBack();
}

FatalRestore::~FatalRestore()
{
    for (FatalSignal const& each : fatalSignals) {
        ::sigaction(each.number, &each.before, nullptr);
    }
}

} // namespace velmora::cli
