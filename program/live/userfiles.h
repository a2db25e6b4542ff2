#pragma once

#include <chrono>
#include <filesystem>
#include <string>

namespace velmora::cli {

// A new file of the live view among the user's data, named by the time: "live/snapshot-20260301-081500.txt", with a
// number behind where that exists. Its folder is made. Throws Error.
std::filesystem::path newUserFile(std::string const& beginning, std::string const& ending,
                                  std::chrono::system_clock::time_point time);

// Writes a text to a file of that kind, and gives its path. Throws Error.
std::filesystem::path saveUserText(std::string const& beginning, std::string const& ending, std::string const& text);

} // namespace velmora::cli
