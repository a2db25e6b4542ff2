#pragma once

namespace tervex {

// Levels of a log line. There is no threshold: every level that is written reaches the file.
enum class LogLevel : int
{
    Debug = 0,
    Info = 1,
    Error = 2,
    Fatal = 3
};

} // namespace tervex
