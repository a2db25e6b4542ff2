#include "libvelmora/output/valuetext.h"
#include "libvelmora/record/checkedfile.h"

#include <velmora/error.h>
#include <velmora/trips.h>

#ifdef VELMORA_OUTPUT_SQLITE
#include "libvelmora/output/database/database.h"
#include "libvelmora/output/database/sqliteschema.h"
#endif

#include <filesystem>

namespace velmora {

#ifdef VELMORA_OUTPUT_SQLITE

namespace {

std::optional<double> realOrNothing(Statement const& row, int column)
{
    return row.isNull(column) ? std::nullopt : std::optional(row.real(column));
}

} // namespace

std::vector<Trip> readTrips(std::string const& file)
{
    requirePlainFile(file);
    if (std::error_code error; !std::filesystem::exists(file, error)) {
        throw Error(ErrorKind::WrongUse, "There is no file " + file, {"name the FILE of watch's output sqlite:FILE"});
    }
    Database database(file, Database::Access::ReadOnly);
    std::int64_t const version = database.number("PRAGMA user_version");
    if (version < 1 || version > sqliteSchemaVersion ||
        database.number("PRAGMA application_id") != sqliteApplicationId) {
        throw Error(ErrorKind::WrongUse, file + " is no database of watch, or one of another version");
    }
    Statement row(database, "SELECT vehicle, begin, end, kind, distance_km, odometer_km, duration_s, idle_s, gap_s, "
                            "fuel_l, mean_kmh, max_kmh, max_rpm, max_coolant_c FROM trip ORDER BY begin, id");
    std::vector<Trip> trips;
    while (row.next()) {
        Trip trip;
        trip.vehicle = row.text(0);
        trip.begin = fromMillis(row.number(1));
        trip.end = fromMillis(row.number(2));
        trip.engineRun = row.text(3) != "trip";
        trip.distanceKm = row.real(4);
        trip.odometerKm = realOrNothing(row, 5);
        trip.durationS = row.real(6);
        trip.idleS = row.real(7);
        trip.gapS = row.real(8);
        trip.fuelL = realOrNothing(row, 9);
        trip.meanKmh = realOrNothing(row, 10);
        trip.maxKmh = realOrNothing(row, 11);
        trip.maxRpm = realOrNothing(row, 12);
        trip.maxCoolantC = realOrNothing(row, 13);
        trips.push_back(std::move(trip));
    }
    return trips;
}

#else

std::vector<Trip> readTrips(std::string const& /*file*/)
{
    throw Error(ErrorKind::WrongUse, "This build has no output of kind sqlite, and reads no database either");
}

#endif

} // namespace velmora
