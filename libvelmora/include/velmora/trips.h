#pragma once

#include <velmora/export.h>

#include <chrono>
#include <optional>
#include <string>
#include <vector>

/// The trips that a watch has written into a database.

namespace velmora {

/// A way from engine start to engine stop. What was not told stays empty.
struct Trip
{
    std::chrono::system_clock::time_point begin; ///< engine start
    std::chrono::system_clock::time_point end;   ///< engine stop
    std::string vehicle;                         ///< name that the watch gave it
    bool engineRun = false;                      ///< too short in way or time to be called a trip
    double distanceKm = 0.0;                     ///< by the speed
    double durationS = 0.0;                      ///< seconds
    double idleS = 0.0;                          ///< of the duration, with the engine on and the car standing
    double gapS = 0.0;                           ///< of the duration, without readings of the speed
    std::optional<double> fuelL;                 ///< litres
    std::optional<double> odometerKm;  ///< difference of the odometer, or of the distance since codes were cleared
    std::optional<double> meanKmh;     ///< speed
    std::optional<double> maxKmh;      ///< speed
    std::optional<double> maxRpm;      ///< engine speed
    std::optional<double> maxCoolantC; ///< coolant temperature
};

/// The trips of a day or a month, without mere engine runs.
struct TripTotal
{
    std::string period;              ///< "2026-05-01", or "2026-05": of the local zone, at the begin of the trips
    int trips = 0;                   ///< how many
    double distanceKm = 0.0;         ///< of all of them
    double durationS = 0.0;          ///< of all of them, in seconds
    double fuelL = 0.0;              ///< litres of those that told them; 0 if none did
    double distanceWithFuelKm = 0.0; ///< of the trips that told their fuel
};

/// All trips and engine runs of a database that the output sqlite:FILE of a watch has written, by their begin. Only
/// reads. Throws Error, and in a build without that output.
VELMORA_EXPORT std::vector<Trip> readTrips(std::string const& file);
/// How far it was: by the odometer where that tells ten kilometres and more, since it counts whole ones.
VELMORA_EXPORT double distanceOf(Trip const& trip);
/// Litres for 100 km; nothing if no fuel was told, or for less than a kilometre.
VELMORA_EXPORT std::optional<double> consumptionOf(double litres, double kilometres);
/// By the day in which they began.
VELMORA_EXPORT std::vector<TripTotal> totalsByDay(std::vector<Trip> const& trips);
/// By the month in which they began.
VELMORA_EXPORT std::vector<TripTotal> totalsByMonth(std::vector<Trip> const& trips);
/// {"trips": [...], "days": [...], "months": [...]}, as it is printed.
VELMORA_EXPORT std::string toJson(std::vector<Trip> const& trips);

} // namespace velmora
