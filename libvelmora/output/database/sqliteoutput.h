#pragma once

#include "libvelmora/output/ballast.h"
#include "libvelmora/output/database/database.h"
#include "libvelmora/output/database/sqliterows.h"
#include "libvelmora/output/ioutput.h"
#include "libvelmora/output/outputaddress.h"

#include <memory>

namespace velmora {

// A database of trips, modules, sensors, readings, codes and events; docs/database.md tells its tables.
class SqliteOutput : public IOutput
{
public:
    explicit SqliteOutput(OutputAddress const& address, ClockSource clocks = lookAtClocks);
    ~SqliteOutput() override;

    void open() override;
    // One transaction.
    void write(Records records) override;
    void close() override;

    // The open database.
    Database& database() { return *m_database; }

private:
    struct Tables
    {
        explicit Tables(Database& database) : undated(database), rows(database, undated) {}

        SqliteUndated undated;
        SqliteRows rows;
    };

    void insertAll(Records records);
    void onFailure();
    void idle();

    std::string const m_file;
    Ballast m_ballast;
    std::unique_ptr<Database> m_database;
    std::unique_ptr<Tables> m_tables;
    ClockKeeper m_keeper;
    unsigned int m_idleCalls = 0;
};

} // namespace velmora
