#pragma once

#include <algorithm>
#include <filesystem>
#include <iterator>
#include <string>

// What this process holds open.
namespace testsupport {

inline long openDescriptors()
{
    using Entries = std::filesystem::directory_iterator;
    return std::distance(Entries("/proc/self/fd"), Entries());
}

inline bool isHeldOpen(std::string const& file)
{
    std::string const whole = std::filesystem::weakly_canonical(file).string();
    return std::ranges::any_of(std::filesystem::directory_iterator("/proc/self/fd"), [&whole](auto const& entry) {
        std::error_code error;
        return std::filesystem::read_symlink(entry.path(), error) == whole;
    });
}

} // namespace testsupport
