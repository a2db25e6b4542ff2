#include "libvelmora/output/mqtt/spool.h"

#include "libvelmora/output/mqtt/spooltext.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <random>

namespace velmora {

namespace {

constexpr std::int64_t spoolApplicationId = 0x766C6D73; // "vlms"
constexpr unsigned long long spoolBallast = 1 << 20;

std::string randomId()
{
    std::random_device random;
    return fmt::format("{:08x}{:08x}", random(), random());
}

} // namespace

Spool::Spool(std::string const& file, unsigned long long maxBytes)
    : m_database(file), m_ballast(file, spoolBallast), m_maxBytes(maxBytes)
{
    prepare();
    Statement id(m_database, "SELECT id FROM meta");
    if (!id.next()) {
        throw Error(ErrorKind::WrongUse, file + " is no spool", {"name another file"});
    }
    m_id = id.text(0);
    m_ballast.keep();
}

void Spool::prepare()
{
    if (m_database.number("SELECT count(*) FROM sqlite_schema") == 0) {
        Transaction transaction(m_database);
        m_database.execute("CREATE TABLE meta (id TEXT NOT NULL, dropped INTEGER NOT NULL, boot TEXT, "
                           "offset INTEGER) STRICT;"
                           "CREATE TABLE row (seq INTEGER PRIMARY KEY AUTOINCREMENT, time INTEGER NOT NULL, "
                           "text TEXT NOT NULL) STRICT;"
                           "CREATE INDEX held ON row (seq) WHERE time = 0;"
                           "PRAGMA application_id=" +
                           std::to_string(spoolApplicationId));
        Statement insert(m_database, "INSERT INTO meta (id, dropped) VALUES (?, 0)");
        insert.bind(1, randomId());
        insert.run();
        transaction.commit();
    } else if (m_database.number("PRAGMA application_id") != spoolApplicationId) {
        throw Error(ErrorKind::WrongUse, m_database.file() + " is no spool", {"name another file"});
    }
}

// On a full disk not even deleting works, for it writes first: the ballast makes the room for that.
template <typename Work>
void Spool::change(Work const& work)
{
    try {
        Transaction transaction(m_database);
        work();
        transaction.commit();
    } catch (Error const&) {
        if (m_database.isFull() && m_ballast.drop()) {
            m_database.checkpoint();
        }
        throw;
    }
}

void Spool::add(std::vector<std::string> const& texts, Time time)
{
    change([&] {
        Statement insert(m_database, "INSERT INTO row (time, text) VALUES (?, ?)");
        insert.bind(1, static_cast<std::int64_t>(time));
        for (std::string const& each : texts) {
            insert.bind(2, each);
            insert.run();
        }
    });
}

std::vector<Spool::Row> Spool::after(std::int64_t seq, std::size_t most)
{
    Statement select(m_database, "SELECT seq, time, text FROM row WHERE seq > ? ORDER BY seq LIMIT ?");
    select.bind(1, seq);
    select.bind(2, static_cast<std::int64_t>(most));
    std::vector<Row> rows;
    while (select.next()) {
        Time const time = static_cast<Time>(select.number(1));
        if (time == Time::Held) {
            break;
        }
        rows.push_back({select.number(0), time, select.text(2)});
    }
    return rows;
}

void Spool::forget(std::int64_t seq)
{
    change([&] {
        Statement remove(m_database, "DELETE FROM row WHERE seq <= ?");
        remove.bind(1, seq);
        remove.run();
    });
    m_ballast.keep();
}

std::int64_t Spool::newest()
{
    return m_database.number("SELECT seq FROM sqlite_sequence WHERE name = 'row'");
}

std::int64_t Spool::span()
{
    return m_database.number("SELECT ifnull((SELECT max(seq) FROM row) - (SELECT min(seq) FROM row) + 1, 0)");
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
    Gap gap;
    change([&] {
        std::int64_t const tenth = rows() / 10 + 1;
        Statement find(m_database, "SELECT seq FROM row ORDER BY seq LIMIT 1 OFFSET ?");
        find.bind(1, tenth - 1);
        if (!find.next()) {
            return;
        }
        gap = {m_database.number("SELECT min(seq) FROM row"), find.number(0)};
        find.reset();
        Statement remove(m_database, "DELETE FROM row WHERE seq <= ?");
        remove.bind(1, gap.last);
        remove.run();
        m_database.execute("UPDATE meta SET dropped = dropped + " + std::to_string(tenth));
    });
    return gap;
}

std::optional<ClockStamp> Spool::heldStamp()
{
    Statement select(m_database, "SELECT boot, offset FROM meta WHERE boot IS NOT NULL");
    return select.next() ? std::optional<ClockStamp>({select.text(0), select.number(1)}) : std::nullopt;
}

void Spool::keepStamp(ClockStamp const& stamp)
{
    change([&] { writeStamp(stamp); });
}

void Spool::writeStamp(ClockStamp const& stamp)
{
    Statement update(m_database, "UPDATE meta SET boot = ?, offset = ?");
    update.bind(1, stamp.bootId);
    update.bind(2, stamp.offset);
    update.run();
}

void Spool::shiftHeld(std::int64_t millis, ClockStamp const& stamp)
{
    change([&] {
        Statement select(m_database, "SELECT seq, text FROM row WHERE time = 0 ORDER BY seq");
        Statement update(m_database, "UPDATE row SET text = ? WHERE seq = ?");
        std::vector<Row> held;
        while (select.next()) {
            held.push_back({select.number(0), Time::Held, select.text(1)});
        }
        for (Row const& each : held) {
            update.bind(1, shiftedText(each.text, millis));
            update.bind(2, each.seq);
            update.run();
        }
        writeStamp(stamp);
    });
}

Spool::Time Spool::timeBy(ClockJudge::Trust trust)
{
    return trust == ClockJudge::Trust::Sure ? Time::Sure : trust == ClockJudge::Trust::Wait ? Time::Held : Time::Unsure;
}

void Spool::release(ClockJudge::Trust trust)
{
    change([&] {
        Statement update(m_database, "UPDATE row SET time = ? WHERE time = 0");
        update.bind(1, static_cast<std::int64_t>(timeBy(trust)));
        update.run();
        m_database.execute("UPDATE meta SET boot = NULL");
    });
}

} // namespace velmora
