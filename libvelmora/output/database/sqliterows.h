#pragma once

#include "libvelmora/output/database/database.h"
#include "libvelmora/output/database/sqliteundated.h"
#include "libvelmora/output/record.h"

#include <map>
#include <tuple>

namespace velmora {

// Puts records into the tables of an open database.
class SqliteRows
{
public:
    // Both must outlive it.
    SqliteRows(Database& database, SqliteUndated& undated);

    // Undated: by a clock that may still be set. Throws Error.
    void insert(Record const& record, bool undated);
    // The transaction was undone: sensors that were new in it are not in the database.
    void forgetSensors() { m_sensors.clear(); }

private:
    struct Inserter;
    using SensorKey = std::tuple<std::string, unsigned int, std::string, std::string>; // vehicle, module, key, unit

    std::int64_t sensorId(std::string const& vehicle, SensorEntry const& sensor);
    void insertReading(Reading const& reading, bool undated);

    SqliteUndated& m_undated;
    Statement m_reading;
    Statement m_addSensor;
    Statement m_findSensor;
    Statement m_module;
    Statement m_codeCame;
    Statement m_codeWent;
    Statement m_event;
    Statement m_trip;
    std::map<SensorKey, std::int64_t> m_sensors;
};

} // namespace velmora
