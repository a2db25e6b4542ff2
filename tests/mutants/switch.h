#pragma once

// Included by the files that scripts/mutate has changed, in its copy of the tree.

#include <cstdlib>
#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

// A changed place may well look wrong.
#pragma GCC diagnostic ignored "-Waddress"
#pragma GCC diagnostic ignored "-Wbool-compare"
#pragma GCC diagnostic ignored "-Wbool-operation"
#pragma GCC diagnostic ignored "-Wconversion"
#pragma GCC diagnostic ignored "-Wdangling-else"
#pragma GCC diagnostic ignored "-Wdiv-by-zero"
#pragma GCC diagnostic ignored "-Wempty-body"
#pragma GCC diagnostic ignored "-Wimplicit-fallthrough"
#pragma GCC diagnostic ignored "-Wint-in-bool-context"
#pragma GCC diagnostic ignored "-Wlogical-not-parentheses"
#pragma GCC diagnostic ignored "-Wmisleading-indentation"
#pragma GCC diagnostic ignored "-Wnarrowing"
#pragma GCC diagnostic ignored "-Wnonnull"
#pragma GCC diagnostic ignored "-Woverflow"
#pragma GCC diagnostic ignored "-Wparentheses"
#pragma GCC diagnostic ignored "-Wreturn-type"
#pragma GCC diagnostic ignored "-Wsequence-point"
#pragma GCC diagnostic ignored "-Wshadow"
#pragma GCC diagnostic ignored "-Wsign-compare"
#pragma GCC diagnostic ignored "-Wtautological-compare"
#pragma GCC diagnostic ignored "-Wtype-limits"
#pragma GCC diagnostic ignored "-Wunused"

namespace mutants {

inline constexpr int most = 16384; // whole pages: the numbers that there may be

/// The number of the change to try.
inline int chosen()
{
    char const* text = std::getenv("VELMORA_MUTANT");
    return text == nullptr ? -1 : std::atoi(text);
}

/// One byte a number, shared with a file, so that a program that is killed has told what it reached.
inline char* notes()
{
    char const* path = std::getenv("VELMORA_REACHED");
    int const file = path == nullptr ? -1 : ::open(path, O_RDWR | O_CLOEXEC);
    if (file < 0) {
        return nullptr;
    }
    void* page = ::mmap(nullptr, most, PROT_READ | PROT_WRITE, MAP_SHARED, file, 0);
    ::close(file);
    return page == MAP_FAILED ? nullptr : static_cast<char*>(page);
}

inline bool isChosen(int number)
{
    static int const on = chosen();
    static char* const reached = notes();
    if (reached != nullptr && number >= 0 && number < most) {
        reached[number] = 1;
    }
    return number == on;
}

/// Whether the change of this number is the one to try. Never so where the compiler itself computes.
constexpr bool isOn(int number)
{
    return !__builtin_is_constant_evaluated() && isChosen(number);
}

} // namespace mutants
