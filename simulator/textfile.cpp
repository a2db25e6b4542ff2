#include "simulator/textfile.h"

#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <sys/stat.h>
#include <unistd.h>

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

/// The output of this program that leads to a plain file of that name, or a negative number.
int streamTo(std::string const& path)
{
    struct stat named = {};
    if (::stat(path.c_str(), &named) != 0 || !S_ISREG(named.st_mode)) {
        return -1;
    }
    for (int const stream : {STDOUT_FILENO, STDERR_FILENO}) {
        struct stat open = {};
        if (::fstat(stream, &open) == 0 && open.st_dev == named.st_dev && open.st_ino == named.st_ino) {
            return stream;
        }
    }
    return -1;
}

int openWithoutWaiting(std::string const& path, int how)
{
    return ::open(path.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC | O_NONBLOCK | how, 0666);
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

std::FILE* openForWriting(std::string const& path)
{
    int const stream = streamTo(path);
    int const handle = stream >= 0 ? ::dup(stream) : openWithoutWaiting(path, O_TRUNC);
    if (handle < 0) {
        return nullptr;
    }
    if (stream < 0) {
        ::fcntl(handle, F_SETFL, 0);
    }
    return ::fdopen(handle, "w");
}

std::FILE* keepForWriting(std::string const& path)
{
    int const handle = openWithoutWaiting(path, O_APPEND);
    return handle < 0 ? nullptr : ::fdopen(handle, "a");
}

} // namespace obdsim
