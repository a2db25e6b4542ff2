#pragma once

#include "libvelmora/output/ballast.h"
#include "libvelmora/output/database.h"
#include "libvelmora/output/ioutput.h"
#include "libvelmora/output/outputaddress.h"

#include <map>
#include <memory>
#include <tuple>

namespace velmora {

// A database of trips, modules, sensors, readings, codes and events; docs/database.md tells its tables.
class SqliteOutput : public IOutput
{
public:
    explicit SqliteOutput(OutputAddress const& address);
    ~SqliteOutput() override;

    void open() override;
    // One transaction.
    void write(Records records) override;
    void close() override;

    // The open database.
    Database& database() { return *m_database; }

private:
    struct Statements;
    struct Inserter;
    using SensorKey = std::tuple<std::string, unsigned int, std::string, std::string>; // vehicle, module, key, unit

    void insertAll(Records records);
    std::int64_t sensorId(std::string const& vehicle, SensorEntry const& sensor);
    void insert(Reading const& reading);
    void onFailure();
    void idle();

    std::string const m_file;
    Ballast m_ballast;
    std::unique_ptr<Database> m_database;
    std::unique_ptr<Statements> m_statements;
    std::map<SensorKey, std::int64_t> m_sensors;
    unsigned int m_idleCalls = 0;
};

} // namespace velmora
