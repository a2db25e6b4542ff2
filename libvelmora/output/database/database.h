#pragma once

#include <cstdint>
#include <optional>
#include <string>

struct sqlite3;
struct sqlite3_stmt;

namespace velmora {

// A SQLite file, for one thread at a time. It and what stands beside it may be read by its owner only.
class Database
{
public:
    enum class Access
    {
        Write,
        ReadOnly,
    };

    // Makes the file if there is none. In write-ahead mode, and each commit is on the disk when it returns: a power cut
    // costs what was not committed, no more. Throws Error.
    explicit Database(std::string const& file, Access access = Access::Write);
    ~Database();
    Database(Database const&) = delete;
    Database& operator=(Database const&) = delete;

    // Any number of statements. Throws Error.
    void execute(std::string const& sql);
    // The first number of the first row. Throws Error.
    std::int64_t number(std::string const& sql);

    // Moves what is committed out of the write-ahead file and empties that, as far as it can be done now.
    void checkpoint();
    // Whether the last failure was that no room is left.
    bool isFull() const { return m_full; }

    std::string const& file() const { return m_file; }
    sqlite3* handle() const { return m_handle; }
    [[noreturn]] void fail();

private:
    std::string const m_file;
    sqlite3* m_handle = nullptr;
    bool m_full = false;
};

// A prepared statement, to be run many times.
class Statement
{
public:
    // The database must outlive it.
    Statement(Database& database, std::string const& sql);
    ~Statement();
    Statement(Statement const&) = delete;
    Statement& operator=(Statement const&) = delete;

    // Parameters count from 1.
    void bind(int parameter, std::int64_t value);
    void bind(int parameter, double value);
    void bind(int parameter, std::string const& value);
    void bindNull(int parameter);
    template <typename T>
    void bind(int parameter, std::optional<T> const& value)
    {
        value ? bind(parameter, *value) : bindNull(parameter);
    }

    // Runs it to its end and makes it ready for the next time. False if a row with that key exists already. Throws
    // Error.
    bool run();
    // Goes to the next row; after the last one it is ready for the next time. Throws Error.
    bool next();
    // Ready for the next time, in the middle of the rows too.
    void reset();

    std::int64_t number(int column) const;
    double real(int column) const;
    std::string text(int column) const;
    bool isNull(int column) const;
    bool isText(int column) const;
    bool isReal(int column) const;

private:
    Database& m_database;
    sqlite3_stmt* m_handle = nullptr;
};

// Undone unless it is committed.
class Transaction
{
public:
    explicit Transaction(Database& database);
    ~Transaction();
    Transaction(Transaction const&) = delete;
    Transaction& operator=(Transaction const&) = delete;

    void commit();

private:
    Database& m_database;
};

} // namespace velmora
