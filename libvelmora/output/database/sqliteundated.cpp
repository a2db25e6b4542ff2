#include "libvelmora/output/database/sqliteundated.h"

#include <vector>

namespace velmora {

namespace {

// Parameters: milliseconds, and the machine's start.
constexpr char const* undatedShifts[] = {
    "UPDATE event SET time = time + ?1 WHERE (time, ifnull(module, 0)) IN "
    "(SELECT time, number FROM undated WHERE place = 'event' AND boot = ?2)",
    "UPDATE trip SET begin = begin + ?1, end = end + ?1 WHERE end IN "
    "(SELECT time FROM undated WHERE place = 'trip' AND boot = ?2)",
    "UPDATE module SET seen = seen + ?1 WHERE (seen, id) IN "
    "(SELECT time, number FROM undated WHERE place = 'module' AND boot = ?2)",
    "UPDATE code SET since = since + ?1 WHERE (since, module) IN "
    "(SELECT time, number FROM undated WHERE place = 'code' AND boot = ?2)",
    "UPDATE code SET gone = gone + ?1 WHERE (gone, module) IN "
    "(SELECT time, number FROM undated WHERE place = 'code gone' AND boot = ?2)",
    "UPDATE undated SET time = time + ?1 WHERE place <> 'reading' AND boot = ?2",
};

struct UndatedReading
{
    std::int64_t row = 0; // of the list
    std::int64_t time = 0;
    std::int64_t sensor = 0;
};

} // namespace

SqliteUndated::SqliteUndated(Database& database)
    : m_database(database), m_add(database, "INSERT INTO undated SELECT ?1, ?2, ?3, boot FROM clock")
{}

void SqliteUndated::add(char const* place, std::int64_t time, std::int64_t number)
{
    m_add.bind(1, std::string(place));
    m_add.bind(2, time);
    m_add.bind(3, number);
    m_add.run();
}

std::optional<ClockStamp> SqliteUndated::heldStamp()
{
    Statement select(m_database, "SELECT boot, offset FROM clock");
    return select.next() ? std::optional<ClockStamp>({select.text(0), select.number(1)}) : std::nullopt;
}

void SqliteUndated::keepStamp(ClockStamp const& stamp)
{
    m_database.execute("DELETE FROM clock");
    Statement insert(m_database, "INSERT INTO clock VALUES (?, ?)");
    insert.bind(1, stamp.bootId);
    insert.bind(2, stamp.offset);
    insert.run();
}

void SqliteUndated::shiftHeld(std::int64_t millis, ClockStamp const& stamp)
{
    shiftReadings(millis, stamp.bootId);
    for (char const* const sql : undatedShifts) {
        Statement shift(m_database, sql);
        shift.bind(1, millis);
        shift.bind(2, stamp.bootId);
        shift.run();
    }
    keepStamp(stamp);
}

// From the far end, so that none meets one that has still to move; a time that is taken is left for the next free one.
void SqliteUndated::shiftReadings(std::int64_t millis, std::string const& boot)
{
    Statement select(m_database, std::string("SELECT rowid, time, number FROM undated WHERE place = 'reading' AND "
                                             "boot = ? ORDER BY time ") +
                                     (millis > 0 ? "DESC" : "ASC"));
    select.bind(1, boot);
    std::vector<UndatedReading> readings;
    while (select.next()) {
        readings.push_back({select.number(0), select.number(1), select.number(2)});
    }
    Statement move(m_database, "UPDATE reading SET time = ?1 WHERE time = ?2 AND sensor = ?3");
    Statement note(m_database, "UPDATE undated SET time = ?1 WHERE rowid = ?2");
    for (UndatedReading const& each : readings) {
        std::int64_t time = each.time + millis;
        move.bind(1, time);
        move.bind(2, each.time);
        move.bind(3, each.sensor);
        while (!move.run()) {
            move.bind(1, ++time);
        }
        note.bind(1, time);
        note.bind(2, each.row);
        note.run();
    }
}

void SqliteUndated::release(ClockJudge::Trust trust)
{
    if (trust == ClockJudge::Trust::Sure) {
        m_database.execute("DELETE FROM undated WHERE boot IN (SELECT boot FROM clock)");
    }
    m_database.execute("DELETE FROM clock");
}

} // namespace velmora
