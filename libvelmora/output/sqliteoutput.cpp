#include "libvelmora/output/sqliteoutput.h"

#include "libvelmora/output/sqliteschema.h"
#include "libvelmora/output/valuetext.h"

#include <velmora/error.h>

#include <cmath>

namespace velmora {

namespace {

constexpr unsigned int checkpointAfter = 60; // calls without records, a second apart
constexpr double largestWhole = 9e15;        // beyond it a double is no exact whole number

void prepareSchema(Database& database)
{
    std::int64_t const tables = database.number("SELECT count(*) FROM sqlite_schema");
    std::int64_t const version = database.number("PRAGMA user_version");
    if (tables == 0) {
        Transaction transaction(database);
        database.execute(sqliteSchema);
        database.execute("PRAGMA application_id=" + std::to_string(sqliteApplicationId));
        database.execute("PRAGMA user_version=" + std::to_string(sqliteSchemaVersion));
        transaction.commit();
        return;
    }
    if (database.number("PRAGMA application_id") != sqliteApplicationId) {
        throw Error(ErrorKind::WrongUse, database.file() + " is the database of another program",
                    {"name another file"});
    }
    if (version != sqliteSchemaVersion) {
        throw Error(ErrorKind::WrongUse,
                    database.file() + " has tables of version " + std::to_string(version) + ", this program writes " +
                        std::to_string(sqliteSchemaVersion),
                    {"name another file, or use the version of the program that made it"});
    }
}

std::optional<std::int64_t> orNull(std::optional<unsigned int> const& value)
{
    return value ? std::optional<std::int64_t>(*value) : std::nullopt;
}

} // namespace

struct SqliteOutput::Statements
{
    explicit Statements(Database& database)
        : reading(database, "INSERT INTO reading VALUES (?, ?, ?)"),
          addSensor(database, "INSERT OR IGNORE INTO sensor (vehicle, module, key, pid, name, unit) "
                              "VALUES (?, ?, ?, ?, ?, ?)"),
          findSensor(database, "SELECT id FROM sensor WHERE vehicle = ? AND module = ? AND key = ? AND unit = ?"),
          module(database, "INSERT OR REPLACE INTO module VALUES (?, ?, ?, ?, ?, ?)"),
          codeCame(database, "INSERT INTO code (vehicle, module, code, kind, text, since) "
                             "SELECT ?1, ?2, ?3, ?4, ?5, ?6 WHERE NOT EXISTS (SELECT 1 FROM code WHERE vehicle = ?1 "
                             "AND module = ?2 AND code = ?3 AND kind = ?4 AND gone IS NULL)"),
          codeWent(database, "UPDATE code SET gone = ? WHERE vehicle = ? AND module = ? AND code = ? AND kind = ? "
                             "AND gone IS NULL"),
          event(database, "INSERT INTO event (time, vehicle, module, kind, text) VALUES (?, ?, ?, ?, ?)"),
          trip(database, "INSERT INTO trip (vehicle, begin, end, kind, distance_km, odometer_km, duration_s, idle_s, "
                         "gap_s, fuel_l, mean_kmh, max_kmh, max_rpm, max_coolant_c) "
                         "VALUES (?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?)")
    {}

    Statement reading;
    Statement addSensor;
    Statement findSensor;
    Statement module;
    Statement codeCame;
    Statement codeWent;
    Statement event;
    Statement trip;
};

struct SqliteOutput::Inserter
{
    SqliteOutput& output;

    void operator()(Reading const& reading) const { output.insert(reading); }
    void operator()(SensorList const& list) const
    {
        for (SensorEntry const& each : list.sensors) {
            output.sensorId(list.vehicle, each);
        }
    }
    void operator()(Event const& event) const
    {
        Statement& statement = output.m_statements->event;
        statement.bind(1, toMillis(event.time));
        statement.bind(2, event.vehicle);
        statement.bind(3, orNull(event.module));
        statement.bind(4, event.kind);
        statement.bind(5, event.text);
        statement.run();
    }
    void operator()(ModuleInfo const& info) const
    {
        Statement& statement = output.m_statements->module;
        statement.bind(1, info.vehicle);
        statement.bind(2, std::int64_t{info.id});
        statement.bind(3, info.name);
        statement.bind(4, info.description);
        statement.bind(5, info.vin.empty() ? std::nullopt : std::optional(info.vin));
        statement.bind(6, toMillis(info.time));
        statement.run();
    }
    void operator()(CodeChange const& code) const { code.present ? came(code) : went(code); }
    void operator()(Trip const& trip) const
    {
        Statement& statement = output.m_statements->trip;
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
    }

    void came(CodeChange const& code) const
    {
        Statement& statement = output.m_statements->codeCame;
        statement.bind(1, code.vehicle);
        statement.bind(2, std::int64_t{code.module});
        statement.bind(3, code.code);
        statement.bind(4, code.kind);
        statement.bind(5, code.text);
        statement.bind(6, toMillis(code.time));
        statement.run();
    }
    void went(CodeChange const& code) const
    {
        Statement& statement = output.m_statements->codeWent;
        statement.bind(1, toMillis(code.time));
        statement.bind(2, code.vehicle);
        statement.bind(3, std::int64_t{code.module});
        statement.bind(4, code.code);
        statement.bind(5, code.kind);
        statement.run();
    }
};

SqliteOutput::SqliteOutput(OutputAddress const& address)
    : m_file(address.target), m_ballast(address.target, parseSize(address.option("ballast", "2M")))
{}

SqliteOutput::~SqliteOutput() = default;

void SqliteOutput::open()
{
    m_statements.reset();
    m_database = std::make_unique<Database>(m_file);
    try {
        prepareSchema(*m_database);
    } catch (Error const&) {
        onFailure();
        throw;
    }
    m_statements = std::make_unique<Statements>(*m_database);
    m_sensors.clear();
    m_ballast.keep();
}

void SqliteOutput::write(Records records)
{
    if (records.empty()) {
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
    for (SharedRecord const& record : records) {
        std::visit(Inserter{*this}, *record);
    }
    transaction.commit();
}

// On a full disk the room of the ballast lets the write-ahead file be emptied, whose room is then there for the rows
// that did not fit.
void SqliteOutput::onFailure()
{
    m_sensors.clear();
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

std::int64_t SqliteOutput::sensorId(std::string const& vehicle, SensorEntry const& sensor)
{
    SensorKey const key(vehicle, sensor.module, sensor.sensor, sensor.unit);
    auto const known = m_sensors.find(key);
    if (known != m_sensors.end()) {
        return known->second;
    }
    Statement& add = m_statements->addSensor;
    add.bind(1, vehicle);
    add.bind(2, std::int64_t{sensor.module});
    add.bind(3, sensor.sensor);
    add.bind(4, sensor.pid);
    add.bind(5, sensor.name);
    add.bind(6, sensor.unit);
    add.run();
    Statement& find = m_statements->findSensor;
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
void SqliteOutput::insert(Reading const& reading)
{
    std::int64_t const sensor =
        sensorId(reading.vehicle, {reading.module, reading.sensor, reading.pid, reading.name, reading.unit});
    Statement& statement = m_statements->reading;
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
}

void SqliteOutput::close()
{
    m_statements.reset();
    if (m_database != nullptr) {
        m_database->checkpoint();
    }
    m_database.reset();
}

} // namespace velmora
