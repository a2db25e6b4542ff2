#include "libvelmora/output/ballast.h"

#include <fcntl.h>
#include <unistd.h>

namespace velmora {

Ballast::Ballast(std::filesystem::path const& database, unsigned long long size)
    : m_file(database.string() + "-ballast"), m_size(size)
{}

bool Ballast::keep()
{
    std::error_code error;
    if (std::filesystem::file_size(m_file, error) == m_size && !error) {
        return true;
    }
    std::filesystem::space_info const space = std::filesystem::space(m_file.parent_path() / ".", error);
    if (error || !fits(space.available)) {
        return false;
    }
    int const descriptor = ::open(m_file.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0600);
    bool const kept = descriptor >= 0 && ::posix_fallocate(descriptor, 0, static_cast<off_t>(m_size)) == 0;
    if (descriptor >= 0) {
        ::close(descriptor);
    }
    if (!kept) {
        drop();
    }
    return kept;
}

bool Ballast::drop()
{
    std::error_code error;
    return std::filesystem::remove(m_file, error);
}

} // namespace velmora
