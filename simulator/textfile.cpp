#include "simulator/textfile.h"

#include <filesystem>
#include <fstream>
#include <iterator>

namespace obdsim {

namespace {

/// Empty where a file can be opened.
std::string whyNotOpened(std::string const& path, std::uintmax_t largest)
{
    std::error_code error;
    if (!std::filesystem::is_regular_file(path, error)) {
        return std::filesystem::exists(path, error) ? "it is no plain file" : "there is no such file";
    }
    std::uintmax_t const size = std::filesystem::file_size(path, error);
    if (error) {
        return error.message();
    }
    return size > largest ? "it is larger than " + std::to_string(largest >> 20U) + " MiB" : "";
}

} // namespace

std::optional<std::string> readTextFile(std::string const& path, std::uintmax_t largest)
{
    if (!whyNotOpened(path, largest).empty()) {
        return std::nullopt;
    }
    std::ifstream file(path, std::ios::binary);
    if (!file.is_open()) {
        return std::nullopt;
    }
    std::string text{std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
    return file.bad() ? std::nullopt : std::optional(std::move(text));
}

std::string whyNoText(std::string const& path, std::uintmax_t largest)
{
    std::string const why = whyNotOpened(path, largest);
    return why.empty() ? "it may not be read" : why;
}

} // namespace obdsim
