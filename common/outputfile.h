#pragma once

#include <cstdio>
#include <filesystem>
#include <system_error>

// Inline, so that core and companion share it also where the core is a shared library.
namespace tervex {

// The stream that the user has redirected to this very file; null for any other file.
inline std::FILE* redirectedTo(std::filesystem::path const& path)
{
    std::error_code ignored;
    if (!std::filesystem::is_regular_file(path, ignored)) {
        return nullptr;
    }
    if (std::filesystem::equivalent(path, "/dev/stdout", ignored)) {
        return stdout;
    }
    return std::filesystem::equivalent(path, "/dev/stderr", ignored) ? stderr : nullptr;
}

// Opens a file for writing, without what stood in it. But what standard output or standard error are redirected to is
// never emptied: that stream writes on in it. Null, with errno set, if it can't be opened.
inline std::FILE* openForWriting(std::filesystem::path const& path)
{
    std::FILE* const stream = redirectedTo(path);
    return stream != nullptr ? stream : std::fopen(path.c_str(), "w");
}

// Closes what was opened so, and leaves the process its streams. Null is nothing to close.
inline void closeWritten(std::FILE* file)
{
    if (file != nullptr && file != stdout && file != stderr) {
        std::fclose(file);
    }
}

} // namespace tervex
