#include "simulator/textfile.h"

#include <filesystem>
#include <fstream>
#include <iterator>

namespace obdsim {

std::optional<std::string> readTextFile(std::string const& path)
{
    std::ifstream file(path, std::ios::binary);
    std::error_code ignored;
    // A folder can be opened, but reading it throws.
    if (!file.is_open() || std::filesystem::is_directory(path, ignored)) {
        return std::nullopt;
    }
    std::string text{std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
    return file.bad() ? std::nullopt : std::optional(std::move(text));
}

} // namespace obdsim
