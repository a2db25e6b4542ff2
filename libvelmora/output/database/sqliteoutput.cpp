#include "libvelmora/output/database/sqliteoutput.h"

#include "libvelmora/output/database/sqliteschema.h"

#include <velmora/error.h>

namespace velmora {

namespace {

constexpr unsigned int checkpointAfter = 60; // calls without records, a second apart

void prepareSchema(Database& database)
{
    std::int64_t const tables = database.number("SELECT count(*) FROM sqlite_schema");
    std::int64_t const version = database.number("PRAGMA user_version");
    if (tables != 0 && database.number("PRAGMA application_id") != sqliteApplicationId) {
        throw Error(ErrorKind::WrongUse, database.file() + " is the database of another program",
                    {"name another file"});
    }
    if (tables == 0 || version == 1) {
        Transaction transaction(database);
        if (tables == 0) {
            database.execute(sqliteSchema);
            database.execute("PRAGMA application_id=" + std::to_string(sqliteApplicationId));
        }
        database.execute(sqliteSchemaSince2);
        database.execute("PRAGMA user_version=" + std::to_string(sqliteSchemaVersion));
        transaction.commit();
    } else if (version != sqliteSchemaVersion) {
        throw Error(ErrorKind::WrongUse,
                    database.file() + " has tables of version " + std::to_string(version) + ", this program writes " +
                        std::to_string(sqliteSchemaVersion),
                    {"name another file, or use the version of the program that made it"});
    }
}

} // namespace

SqliteOutput::SqliteOutput(OutputAddress const& address, ClockSource clocks)
    : m_file(address.target), m_ballast(address.target, parseSize(address.option("ballast", "2M"))),
      m_keeper(std::move(clocks))
{}

SqliteOutput::~SqliteOutput() = default;

void SqliteOutput::open()
{
    m_tables.reset();
    m_database = std::make_unique<Database>(m_file);
    try {
        prepareSchema(*m_database);
        m_tables = std::make_unique<Tables>(*m_database);
        Transaction transaction(*m_database);
        m_keeper.resume(m_tables->undated);
        transaction.commit();
    } catch (Error const&) {
        onFailure();
        throw;
    }
    m_ballast.keep();
}

void SqliteOutput::write(Records records)
{
    bool const dating = m_keeper.trust() == ClockJudge::Trust::Wait;
    if (records.empty() && !dating) {
        idle();
        return;
    }
    m_idleCalls = 0;
    try {
        insertAll(records);
    } catch (Error const&) {
        onFailure();
        throw;
    }
    m_ballast.keep();
}

void SqliteOutput::insertAll(Records records)
{
    Transaction transaction(*m_database);
    m_keeper.begin(m_tables->undated);
    bool const undated = m_keeper.trust() == ClockJudge::Trust::Wait;
    for (SharedRecord const& record : records) {
        m_tables->rows.insert(*m_keeper.dated(record), undated);
    }
    transaction.commit();
    m_keeper.done();
}

// On a full disk the room of the ballast lets the write-ahead file be emptied, whose room is then there for the rows
// that did not fit.
void SqliteOutput::onFailure()
{
    if (m_tables != nullptr) {
        m_tables->rows.forgetSensors();
    }
    if (m_database->isFull() && m_ballast.drop()) {
        m_database->checkpoint();
    }
}

// While the car is parked nothing is written for hours: then all of it lies in the one file.
void SqliteOutput::idle()
{
    if (++m_idleCalls == checkpointAfter) {
        m_database->checkpoint();
    }
}

void SqliteOutput::close()
{
    m_tables.reset();
    if (m_database != nullptr) {
        m_database->checkpoint();
    }
    m_database.reset();
}

} // namespace velmora
