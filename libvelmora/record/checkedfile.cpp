#include "libvelmora/record/checkedfile.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <unistd.h>

namespace velmora {

void requireWritable(std::filesystem::path const& file, std::string const& what)
{
    int const handle = ::open(file.c_str(), O_WRONLY | O_CREAT | O_APPEND | O_CLOEXEC | O_NONBLOCK, 0644);
    if (handle >= 0) {
        ::close(handle);
        return;
    }
    if (errno == ENXIO) {
        throw Error(ErrorKind::Failed, "Nobody reads the " + what + " " + file.string() + ", which is a pipe",
                    {"start its reader first, or name a file"});
    }
    throw Error(ErrorKind::Failed, "Could not write the " + what + " " + file.string() + ": " + std::strerror(errno),
                {"does its folder exist, and may you write there?"});
}

void requirePlainFile(std::filesystem::path const& file)
{
    std::error_code error;
    std::filesystem::file_status const status = std::filesystem::status(file, error);
    if (!std::filesystem::exists(status) || std::filesystem::is_regular_file(status)) {
        return;
    }
    char const* const kind = std::filesystem::is_directory(status) ? "a folder"
                             : std::filesystem::is_fifo(status)    ? "a pipe"
                                                                   : "a device";
    throw Error(ErrorKind::WrongUse, fmt::format("{} is {}, no plain file", file.string(), kind), {"name a file"});
}

std::string whyUnreadable(std::filesystem::path const& file, std::uintmax_t largest)
{
    std::error_code error;
    if (!std::filesystem::is_regular_file(file, error)) {
        return std::filesystem::exists(file, error) ? "it is no plain file" : "there is no such file";
    }
    std::uintmax_t const size = std::filesystem::file_size(file, error);
    if (error) {
        return error.message();
    }
    return size > largest ? fmt::format("it has {} bytes; at most {} are read", size, largest) : "";
}

} // namespace velmora
