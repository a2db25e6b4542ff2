#include "libvelmora/output/database/database.h"

#include <velmora/error.h>

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <sqlite3.h>
#include <unistd.h>

namespace velmora {

namespace {

constexpr int busyMillis = 2000; // another program reads or checks the file

// SQLite gives the files beside it the same rights.
void createPrivately(std::string const& file)
{
    int const descriptor = ::open(file.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600);
    if (descriptor < 0) {
        throw Error(ErrorKind::Failed, "Could not open " + file + ": " + std::strerror(errno),
                    {"does the folder exist, and may you write there?"});
    }
    ::close(descriptor);
}

} // namespace

Database::Database(std::string const& file, Access access) : m_file(file)
{
    bool const writes = access == Access::Write;
    if (writes) {
        createPrivately(file);
    }
    int const flags = (writes ? SQLITE_OPEN_READWRITE : SQLITE_OPEN_READONLY) | SQLITE_OPEN_NOMUTEX;
    if (::sqlite3_open_v2(file.c_str(), &m_handle, flags, nullptr) != SQLITE_OK) {
        std::string const why = ::sqlite3_errmsg(m_handle);
        ::sqlite3_close(m_handle);
        throw Error(ErrorKind::Failed, "Could not open " + file + ": " + why);
    }
    try {
        ::sqlite3_busy_timeout(m_handle, busyMillis);
        if (writes) {
            execute("PRAGMA journal_mode=WAL; PRAGMA synchronous=FULL; PRAGMA journal_size_limit=1048576;");
        }
    } catch (...) {
        ::sqlite3_close(m_handle);
        throw;
    }
}

Database::~Database()
{
    ::sqlite3_close(m_handle);
}

void Database::fail()
{
    int const code = ::sqlite3_errcode(m_handle);
    m_full = code == SQLITE_FULL;
    if (code == SQLITE_NOTADB) {
        throw Error(ErrorKind::WrongUse, m_file + " is no database", {"name another file"});
    }
    throw Error(ErrorKind::Failed, "Could not use " + m_file + ": " + ::sqlite3_errmsg(m_handle),
                {m_full ? "is there room on the disk?" : "does another program hold the file?"});
}

void Database::execute(std::string const& sql)
{
    if (::sqlite3_exec(m_handle, sql.c_str(), nullptr, nullptr, nullptr) != SQLITE_OK) {
        fail();
    }
}

std::int64_t Database::number(std::string const& sql)
{
    Statement statement(*this, sql);
    return statement.next() ? statement.number(0) : 0;
}

void Database::checkpoint()
{
    ::sqlite3_wal_checkpoint_v2(m_handle, nullptr, SQLITE_CHECKPOINT_TRUNCATE, nullptr, nullptr);
}

Statement::Statement(Database& database, std::string const& sql) : m_database(database)
{
    if (::sqlite3_prepare_v2(database.handle(), sql.c_str(), -1, &m_handle, nullptr) != SQLITE_OK) {
        database.fail();
    }
}

Statement::~Statement()
{
    ::sqlite3_finalize(m_handle);
}

void Statement::bind(int parameter, std::int64_t value)
{
    ::sqlite3_bind_int64(m_handle, parameter, value);
}

void Statement::bind(int parameter, double value)
{
    ::sqlite3_bind_double(m_handle, parameter, value);
}

void Statement::bind(int parameter, std::string const& value)
{
    ::sqlite3_bind_text(m_handle, parameter, value.data(), static_cast<int>(value.size()), SQLITE_TRANSIENT);
}

void Statement::bindNull(int parameter)
{
    ::sqlite3_bind_null(m_handle, parameter);
}

bool Statement::run()
{
    int const result = ::sqlite3_step(m_handle);
    if (::sqlite3_extended_errcode(m_database.handle()) == SQLITE_CONSTRAINT_PRIMARYKEY) {
        reset();
        return false;
    }
    if (result != SQLITE_DONE && result != SQLITE_ROW) {
        ::sqlite3_reset(m_handle);
        m_database.fail();
    }
    reset();
    return true;
}

bool Statement::next()
{
    int const result = ::sqlite3_step(m_handle);
    if (result == SQLITE_ROW) {
        return true;
    }
    if (result != SQLITE_DONE) {
        ::sqlite3_reset(m_handle);
        m_database.fail();
    }
    reset();
    return false;
}

void Statement::reset()
{
    ::sqlite3_reset(m_handle);
}

std::int64_t Statement::number(int column) const
{
    return ::sqlite3_column_int64(m_handle, column);
}

double Statement::real(int column) const
{
    return ::sqlite3_column_double(m_handle, column);
}

std::string Statement::text(int column) const
{
    unsigned char const* const bytes = ::sqlite3_column_text(m_handle, column);
    auto const size = static_cast<std::size_t>(::sqlite3_column_bytes(m_handle, column));
    return bytes == nullptr ? std::string() : std::string(bytes, bytes + size);
}

bool Statement::isNull(int column) const
{
    return ::sqlite3_column_type(m_handle, column) == SQLITE_NULL;
}

bool Statement::isText(int column) const
{
    return ::sqlite3_column_type(m_handle, column) == SQLITE_TEXT;
}

bool Statement::isReal(int column) const
{
    return ::sqlite3_column_type(m_handle, column) == SQLITE_FLOAT;
}

Transaction::Transaction(Database& database) : m_database(database)
{
    m_database.execute("BEGIN IMMEDIATE");
}

// A commit that found the disk full has rolled back already.
Transaction::~Transaction()
{
    if (::sqlite3_get_autocommit(m_database.handle()) == 0) {
        ::sqlite3_exec(m_database.handle(), "ROLLBACK", nullptr, nullptr, nullptr);
    }
}

void Transaction::commit()
{
    m_database.execute("COMMIT");
}

} // namespace velmora
