#include "libvelmora/output/spool.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <random>

namespace velmora {

namespace {

constexpr std::int64_t spoolApplicationId = 0x766C6D73; // "vlms"

std::string randomId()
{
    std::random_device random;
    return fmt::format("{:08x}{:08x}", random(), random());
}

} // namespace

Spool::Spool(std::string const& file, unsigned long long maxBytes) : m_database(file), m_maxBytes(maxBytes)
{
    prepare();
    Statement id(m_database, "SELECT id FROM meta");
    if (!id.next()) {
        throw Error(ErrorKind::WrongUse, file + " is no spool", {"name another file"});
    }
    m_id = id.text(0);
}

void Spool::prepare()
{
    if (m_database.number("SELECT count(*) FROM sqlite_schema") == 0) {
        Transaction transaction(m_database);
        m_database.execute("CREATE TABLE meta (id TEXT NOT NULL, dropped INTEGER NOT NULL) STRICT;"
                           "CREATE TABLE row (seq INTEGER PRIMARY KEY AUTOINCREMENT, text TEXT NOT NULL) STRICT;"
                           "PRAGMA application_id=" +
                           std::to_string(spoolApplicationId));
        Statement insert(m_database, "INSERT INTO meta VALUES (?, 0)");
        insert.bind(1, randomId());
        insert.run();
        transaction.commit();
    } else if (m_database.number("PRAGMA application_id") != spoolApplicationId) {
        throw Error(ErrorKind::WrongUse, m_database.file() + " is no spool", {"name another file"});
    }
}

void Spool::add(std::vector<std::string> const& texts)
{
    Transaction transaction(m_database);
    Statement insert(m_database, "INSERT INTO row (text) VALUES (?)");
    for (std::string const& each : texts) {
        insert.bind(1, each);
        insert.run();
    }
    transaction.commit();
}

std::vector<Spool::Row> Spool::after(std::int64_t seq, std::size_t most)
{
    Statement select(m_database, "SELECT seq, text FROM row WHERE seq > ? ORDER BY seq LIMIT ?");
    select.bind(1, seq);
    select.bind(2, static_cast<std::int64_t>(most));
    std::vector<Row> rows;
    while (select.next()) {
        rows.push_back({select.number(0), select.text(1)});
    }
    return rows;
}

void Spool::forget(std::int64_t seq)
{
    Statement remove(m_database, "DELETE FROM row WHERE seq <= ?");
    remove.bind(1, seq);
    remove.run();
}

std::int64_t Spool::usedBytes()
{
    return (m_database.number("PRAGMA page_count") - m_database.number("PRAGMA freelist_count")) *
           m_database.number("PRAGMA page_size");
}

Spool::Gap Spool::makeRoom()
{
    if (static_cast<unsigned long long>(usedBytes()) <= m_maxBytes) {
        return {};
    }
    Transaction transaction(m_database);
    std::int64_t const first = m_database.number("SELECT min(seq) FROM row");
    std::int64_t const tenth = rows() / 10 + 1;
    Statement find(m_database, "SELECT seq FROM row ORDER BY seq LIMIT 1 OFFSET ?");
    find.bind(1, tenth - 1);
    if (!find.next()) {
        return {};
    }
    std::int64_t const last = find.number(0);
    find.reset();
    forget(last);
    m_database.execute("UPDATE meta SET dropped = dropped + " + std::to_string(tenth));
    transaction.commit();
    return {first, last};
}

} // namespace velmora
