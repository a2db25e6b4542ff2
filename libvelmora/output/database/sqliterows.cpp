#include "libvelmora/output/database/sqliterows.h"

#include "libvelmora/output/valuetext.h"

#include <cmath>

namespace velmora {

namespace {

constexpr double largestWhole = 9e15; // beyond it a double is no exact whole number

std::optional<std::int64_t> orNull(std::optional<unsigned int> const& value)
{
    return value ? std::optional<std::int64_t>(*value) : std::nullopt;
}

} // namespace

SqliteRows::SqliteRows(Database& database, SqliteUndated& undated)
    : m_undated(undated), m_reading(database, "INSERT INTO reading VALUES (?, ?, ?)"),
      m_addSensor(database, "INSERT OR IGNORE INTO sensor (vehicle, module, key, pid, name, unit) "
                            "VALUES (?, ?, ?, ?, ?, ?)"),
      m_findSensor(database, "SELECT id FROM sensor WHERE vehicle = ? AND module = ? AND key = ? AND unit = ?"),
      m_module(database, "INSERT OR REPLACE INTO module VALUES (?, ?, ?, ?, ?, ?)"),
      m_codeCame(database, "INSERT INTO code (vehicle, module, code, kind, text, since) "
                           "SELECT ?1, ?2, ?3, ?4, ?5, ?6 WHERE NOT EXISTS (SELECT 1 FROM code WHERE vehicle = ?1 "
                           "AND module = ?2 AND code = ?3 AND kind = ?4 AND gone IS NULL)"),
      m_codeWent(database, "UPDATE code SET gone = ? WHERE vehicle = ? AND module = ? AND code = ? AND kind = ? "
                           "AND gone IS NULL"),
      m_event(database, "INSERT INTO event (time, vehicle, module, kind, text) VALUES (?, ?, ?, ?, ?)"),
      m_trip(database, "INSERT INTO trip (vehicle, begin, end, kind, distance_km, odometer_km, duration_s, idle_s, "
                       "gap_s, fuel_l, mean_kmh, max_kmh, max_rpm, max_coolant_c) "
                       "VALUES (?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?)")
{}

struct SqliteRows::Inserter
{
    SqliteRows& rows;
    bool undated;

    void operator()(Reading const& reading) const { rows.insertReading(reading, undated); }
    void operator()(LampState const& /*lamp*/) const {}
    void operator()(SensorList const& list) const
    {
        for (SensorEntry const& each : list.sensors) {
            rows.sensorId(list.vehicle, each);
        }
    }
    void operator()(Event const& event) const
    {
        Statement& statement = rows.m_event;
        statement.bind(1, toMillis(event.time));
        statement.bind(2, event.vehicle);
        statement.bind(3, orNull(event.module));
        statement.bind(4, event.kind);
        statement.bind(5, event.text);
        statement.run();
        mark(SqliteUndated::event, event.time, event.module.value_or(0));
    }
    void operator()(ModuleInfo const& info) const
    {
        Statement& statement = rows.m_module;
        statement.bind(1, info.vehicle);
        statement.bind(2, std::int64_t{info.id});
        statement.bind(3, info.name);
        statement.bind(4, info.description);
        statement.bind(5, info.vin.empty() ? std::nullopt : std::optional(info.vin));
        statement.bind(6, toMillis(info.time));
        statement.run();
        mark(SqliteUndated::module, info.time, info.id);
    }
    void operator()(CodeChange const& code) const { code.present ? came(code) : went(code); }
    void operator()(Trip const& trip) const
    {
        Statement& statement = rows.m_trip;
        statement.bind(1, trip.vehicle);
        statement.bind(2, toMillis(trip.begin));
        statement.bind(3, toMillis(trip.end));
        statement.bind(4, std::string(trip.engineRun ? "engine run" : "trip"));
        statement.bind(5, trip.distanceKm);
        statement.bind(6, trip.odometerKm);
        statement.bind(7, trip.durationS);
        statement.bind(8, trip.idleS);
        statement.bind(9, trip.gapS);
        statement.bind(10, trip.fuelL);
        statement.bind(11, trip.meanKmh);
        statement.bind(12, trip.maxKmh);
        statement.bind(13, trip.maxRpm);
        statement.bind(14, trip.maxCoolantC);
        statement.run();
        mark(SqliteUndated::trip, trip.end, 0);
    }

    void came(CodeChange const& code) const
    {
        Statement& statement = rows.m_codeCame;
        statement.bind(1, code.vehicle);
        statement.bind(2, std::int64_t{code.module});
        statement.bind(3, code.code);
        statement.bind(4, code.kind);
        statement.bind(5, code.text);
        statement.bind(6, toMillis(code.time));
        statement.run();
        mark(SqliteUndated::code, code.time, code.module);
    }
    void went(CodeChange const& code) const
    {
        Statement& statement = rows.m_codeWent;
        statement.bind(1, toMillis(code.time));
        statement.bind(2, code.vehicle);
        statement.bind(3, std::int64_t{code.module});
        statement.bind(4, code.code);
        statement.bind(5, code.kind);
        statement.run();
        mark(SqliteUndated::codeGone, code.time, code.module);
    }
    void mark(char const* place, WallTime time, unsigned int number) const
    {
        if (undated) {
            rows.m_undated.add(place, toMillis(time), number);
        }
    }
};

void SqliteRows::insert(Record const& record, bool undated)
{
    std::visit(Inserter{*this, undated}, record);
}

std::int64_t SqliteRows::sensorId(std::string const& vehicle, SensorEntry const& sensor)
{
    SensorKey const key(vehicle, sensor.module, sensor.sensor, sensor.unit);
    auto const known = m_sensors.find(key);
    if (known != m_sensors.end()) {
        return known->second;
    }
    Statement& add = m_addSensor;
    add.bind(1, vehicle);
    add.bind(2, std::int64_t{sensor.module});
    add.bind(3, sensor.sensor);
    add.bind(4, sensor.pid);
    add.bind(5, sensor.name);
    add.bind(6, sensor.unit);
    add.run();
    Statement& find = m_findSensor;
    find.bind(1, vehicle);
    find.bind(2, std::int64_t{sensor.module});
    find.bind(3, sensor.sensor);
    find.bind(4, sensor.unit);
    find.next();
    std::int64_t const id = find.number(0);
    find.reset();
    return m_sensors[key] = id;
}

// A clock that was set back brings times a second time: such a reading moves to the next free millisecond.
void SqliteRows::insertReading(Reading const& reading, bool undated)
{
    std::int64_t const sensor =
        sensorId(reading.vehicle, {reading.module, reading.sensor, reading.pid, reading.name, reading.unit});
    Statement& statement = m_reading;
    statement.bind(2, sensor);
    std::optional<double> const number = numberOf(reading);
    if (std::string const* const text = std::get_if<std::string>(&reading.value)) {
        statement.bind(3, *text);
    } else if (number && std::abs(*number) < largestWhole && *number == std::floor(*number)) {
        statement.bind(3, static_cast<std::int64_t>(*number));
    } else {
        statement.bind(3, number);
    }
    std::int64_t time = toMillis(reading.time);
    statement.bind(1, time);
    while (!statement.run()) {
        statement.bind(1, ++time);
    }
    if (undated) {
        m_undated.add(SqliteUndated::reading, time, sensor);
    }
}

} // namespace velmora
