#include "program/view/tripstext.h"

#include "libvelmora/output/recordjson.h"
#include "libvelmora/output/valuetext.h"

#include <fmt/chrono.h>
#include <fmt/format.h>
#include <nlohmann/json.hpp>

#include <map>

namespace velmora::cli {

namespace {

struct TripTotal
{
    int trips = 0;
    double km = 0.0;
    double seconds = 0.0;
    double litres = 0.0;
    double kmWithFuel = 0.0; // of the trips that told their fuel
};
using TripTotals = std::map<std::string, TripTotal>;

std::string localText(WallTime time, char const* form)
{
    std::time_t const seconds = std::chrono::system_clock::to_time_t(time);
    std::tm fields{};
    ::localtime_r(&seconds, &fields);
    char text[32] = {};
    std::strftime(text, sizeof(text), form, &fields);
    return text;
}

double kilometres(Trip const& trip)
{
    return trip.odometerKm && *trip.odometerKm >= 10.0 ? *trip.odometerKm : trip.distanceKm; // told in whole ones
}

TripTotals totalsBy(std::vector<Trip> const& trips, char const* form)
{
    TripTotals totals;
    for (Trip const& trip : trips) {
        if (trip.engineRun) {
            continue;
        }
        TripTotal& total = totals[localText(trip.begin, form)];
        ++total.trips;
        total.km += kilometres(trip);
        total.seconds += trip.durationS;
        total.litres += trip.fuelL.value_or(0.0);
        total.kmWithFuel += trip.fuelL ? kilometres(trip) : 0.0;
    }
    return totals;
}

std::string orDash(std::optional<double> const& value, int digits)
{
    return value ? fmt::format("{:.{}f}", *value, digits) : "-";
}

std::optional<double> consumption(double litres, double km)
{
    return litres > 0.0 && km >= 1.0 ? std::optional(litres / km * 100.0) : std::nullopt;
}

std::string hours(double seconds)
{
    long const minutes = static_cast<long>(seconds / 60.0 + 0.5);
    return fmt::format("{}:{:02}", minutes / 60, minutes % 60);
}

std::string totalLines(TripTotals const& totals, char const* heading)
{
    std::string text =
        fmt::format("\n{:<18} {:>6} {:>9} {:>7} {:>7} {:>8}\n", heading, "Trips", "km", "h:min", "l", "l/100 km");
    for (auto const& [name, total] : totals) {
        bool const fuel = total.litres > 0.0;
        text += fmt::format("{:<18} {:>6} {:>9.1f} {:>7} {:>7} {:>8}\n", name, total.trips, total.km,
                            hours(total.seconds), orDash(fuel ? std::optional(total.litres) : std::nullopt, 1),
                            orDash(consumption(total.litres, total.kmWithFuel), 1));
    }
    return text;
}

nlohmann::ordered_json totalsJson(TripTotals const& totals)
{
    nlohmann::ordered_json list = nlohmann::ordered_json::array();
    for (auto const& [name, total] : totals) {
        nlohmann::ordered_json fuel = nullptr;
        if (total.litres > 0.0) {
            fuel = total.litres;
        }
        list.push_back({{"period", name},
                        {"trips", total.trips},
                        {"distance_km", total.km},
                        {"duration_s", total.seconds},
                        {"fuel_l", fuel}});
    }
    return list;
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
            trip.fuelL && !trip.engineRun ? consumption(*trip.fuelL, kilometres(trip)) : std::nullopt;
        text += fmt::format("{:<18} {:<12} {:>9.1f} {:>7} {:>7} {:>7} {:>8} {:>8}{}\n",
                            localText(trip.begin, "%Y-%m-%d %H:%M"), trip.vehicle, kilometres(trip),
                            hours(trip.durationS), hours(trip.idleS), orDash(trip.maxKmh, 0), orDash(trip.fuelL, 2),
                            orDash(mean, 1), trip.engineRun ? "  engine run" : "");
    }
    return text + totalLines(totalsBy(trips, "%Y-%m-%d"), "Day") + totalLines(totalsBy(trips, "%Y-%m"), "Month");
}

std::string tripsCsv(std::vector<Trip> const& trips)
{
    std::string text = "begin,end,vehicle,kind,distance_km,odometer_km,duration_s,idle_s,gap_s,fuel_l,mean_kmh,max_kmh,"
                       "max_rpm,max_coolant_c\n";
    for (Trip const& trip : trips) {
        text += fmt::format("{},{},{},{},{:.3f},{},{:.0f},{:.0f},{:.0f},{},{},{},{},{}\n", utcTime(trip.begin),
                            utcTime(trip.end), csvField(trip.vehicle), trip.engineRun ? "engine run" : "trip",
                            trip.distanceKm, orDash(trip.odometerKm, 0), trip.durationS, trip.idleS, trip.gapS,
                            orDash(trip.fuelL, 3), orDash(trip.meanKmh, 1), orDash(trip.maxKmh, 0),
                            orDash(trip.maxRpm, 0), orDash(trip.maxCoolantC, 0));
    }
    return text;
}

std::string tripsJson(std::vector<Trip> const& trips)
{
    nlohmann::ordered_json list = nlohmann::ordered_json::array();
    for (Trip const& trip : trips) {
        list.push_back(toJsonValue(trip));
    }
    nlohmann::ordered_json const document = {{"trips", list},
                                             {"days", totalsJson(totalsBy(trips, "%Y-%m-%d"))},
                                             {"months", totalsJson(totalsBy(trips, "%Y-%m"))}};
    return document.dump(2, ' ', false, nlohmann::ordered_json::error_handler_t::replace) + "\n";
}

} // namespace velmora::cli
