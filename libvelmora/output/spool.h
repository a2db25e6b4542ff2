#pragma once

#include "libvelmora/output/database.h"

#include <cstdint>
#include <string>
#include <vector>

namespace velmora {

// What waits to be sent, on the disk. A row is known by the spool's random id and its number, never by its time:
// numbers rise and are never used again, also after all rows are gone. For one thread at a time.
class Spool
{
public:
    struct Row
    {
        std::int64_t seq = 0;
        std::string text;
    };

    // Above so many bytes the oldest rows make room. Throws Error.
    Spool(std::string const& file, unsigned long long maxBytes);

    // 16 hexadecimal digits, new with each new file.
    std::string const& id() const { return m_id; }

    // All of them or none. Throws Error.
    void add(std::vector<std::string> const& texts);
    // The first rows behind that number.
    std::vector<Row> after(std::int64_t seq, std::size_t most);
    // Forgets all up to that number.
    void forget(std::int64_t seq);
    // Makes room if the file is too large; the numbers that were lost are told as first and last, 0 for none.
    struct Gap
    {
        std::int64_t first = 0;
        std::int64_t last = 0;
    };
    Gap makeRoom();

    std::int64_t rows() { return m_database.number("SELECT count(*) FROM row"); }
    // How many makeRoom has dropped, ever.
    std::int64_t dropped() { return m_database.number("SELECT dropped FROM meta"); }

private:
    void prepare();
    std::int64_t usedBytes();

    Database m_database;
    unsigned long long const m_maxBytes;
    std::string m_id;
};

} // namespace velmora
