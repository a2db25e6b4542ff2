#pragma once

#include <filesystem>

namespace velmora {

// A file that holds room on the disk for a database: on a full one not even deleting rows or emptying the write-ahead
// file works, for both write first.
class Ballast
{
public:
    // Beside the database, that many bytes.
    Ballast(std::filesystem::path const& database, unsigned long long size);

    // Writes the file if it is missing and the disk has room for it four times over. False without it.
    bool keep();
    // False if there was none.
    bool drop();
    // Whether so many free bytes are enough to keep it.
    bool fits(unsigned long long available) const { return available / 4 >= m_size; }

    std::filesystem::path const& file() const { return m_file; }

private:
    std::filesystem::path const m_file;
    unsigned long long const m_size;
};

} // namespace velmora
