#include "program/view/tripstext.h"

#include "common/text/text.h"
#include "program/view/timetext.h"

#include <fmt/format.h>

namespace velmora::cli {

namespace {

std::string orDash(std::optional<double> const& value, int digits)
{
    return value ? fmt::format("{:.{}f}", *value, digits) : "-";
}

std::string hours(double seconds)
{
    long const minutes = static_cast<long>(seconds / 60.0 + 0.5);
    return fmt::format("{}:{:02}", minutes / 60, minutes % 60);
}

std::string totalLines(std::vector<TripTotal> const& totals, char const* heading)
{
    std::string text =
        fmt::format("\n{:<18} {:>6} {:>9} {:>7} {:>7} {:>8}\n", heading, "Trips", "km", "h:min", "l", "l/100 km");
    for (TripTotal const& total : totals) {
        std::optional<double> const fuel = total.fuelL > 0.0 ? std::optional(total.fuelL) : std::nullopt;
        text += fmt::format("{:<18} {:>6} {:>9.1f} {:>7} {:>7} {:>8}\n", total.period, total.trips, total.distanceKm,
                            hours(total.durationS), orDash(fuel, 1),
                            orDash(consumptionOf(total.fuelL, total.distanceWithFuelKm), 1));
    }
    return text;
}

} // namespace

std::string tripsText(std::vector<Trip> const& trips)
{
    if (trips.empty()) {
        return "No trips yet\n";
    }
    std::string text = fmt::format("{:<18} {:<12} {:>9} {:>7} {:>7} {:>7} {:>8} {:>8}\n", "Begin", "Vehicle", "km",
                                   "h:min", "idle", "max", "l", "l/100 km");
    for (Trip const& trip : trips) {
        std::optional<double> const mean =
            trip.fuelL && !trip.engineRun ? consumptionOf(*trip.fuelL, distanceOf(trip)) : std::nullopt;
        text += fmt::format("{:<18} {:<12} {:>9.1f} {:>7} {:>7} {:>7} {:>8} {:>8}{}\n",
                            localTime(trip.begin, "%Y-%m-%d %H:%M"), trip.vehicle, distanceOf(trip),
                            hours(trip.durationS), hours(trip.idleS), orDash(trip.maxKmh, 0), orDash(trip.fuelL, 2),
                            orDash(mean, 1), trip.engineRun ? "  engine run" : "");
    }
    return text + totalLines(totalsByDay(trips), "Day") + totalLines(totalsByMonth(trips), "Month");
}

std::string tripsCsv(std::vector<Trip> const& trips)
{
    std::string text = "begin,end,vehicle,kind,distance_km,odometer_km,duration_s,idle_s,gap_s,fuel_l,mean_kmh,max_kmh,"
                       "max_rpm,max_coolant_c\n";
    for (Trip const& trip : trips) {
        text += fmt::format("{},{},{},{},{:.3f},{},{:.0f},{:.0f},{:.0f},{},{},{},{},{}\n", isoTime(trip.begin),
                            isoTime(trip.end), csvField(trip.vehicle), trip.engineRun ? "engine run" : "trip",
                            trip.distanceKm, orDash(trip.odometerKm, 0), trip.durationS, trip.idleS, trip.gapS,
                            orDash(trip.fuelL, 3), orDash(trip.meanKmh, 1), orDash(trip.maxKmh, 0),
                            orDash(trip.maxRpm, 0), orDash(trip.maxCoolantC, 0));
    }
    return text;
}

} // namespace velmora::cli
