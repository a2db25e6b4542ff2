#pragma once

#include <velmora/error.h>

namespace velmora::cli {

// What the program tells its caller; documented in the README. An error's kind is its exit code.
enum class ExitCode : int
{
    Done = 0,
    Failed = static_cast<int>(ErrorKind::Failed),
    WrongUse = static_cast<int>(ErrorKind::WrongUse),
    Findings = 10, // with --check: the lamp is on or a code is stored
    Interrupted = static_cast<int>(ErrorKind::Interrupted),
};

inline ExitCode exitCode(Error const& error)
{
    return static_cast<ExitCode>(error.kind());
}

} // namespace velmora::cli
