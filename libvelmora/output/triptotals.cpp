#include "libvelmora/output/recordjson.h"
#include "libvelmora/report/json.h"

#include <velmora/trips.h>

#include <ctime>
#include <map>

namespace velmora {

namespace {

constexpr double sureOdometerKm = 10.0; // it counts whole ones

std::string localPeriod(Trip const& trip, char const* form)
{
    std::time_t const seconds = std::chrono::system_clock::to_time_t(trip.begin);
    std::tm fields{};
    ::localtime_r(&seconds, &fields);
    char text[32] = {};
    std::strftime(text, sizeof(text), form, &fields);
    return text;
}

std::vector<TripTotal> totalsBy(std::vector<Trip> const& trips, char const* form)
{
    std::map<std::string, TripTotal> totals;
    for (Trip const& trip : trips) {
        if (trip.engineRun) {
            continue;
        }
        TripTotal& total = totals[localPeriod(trip, form)];
        ++total.trips;
        total.distanceKm += distanceOf(trip);
        total.durationS += trip.durationS;
        total.fuelL += trip.fuelL.value_or(0.0);
        total.distanceWithFuelKm += trip.fuelL ? distanceOf(trip) : 0.0;
    }
    std::vector<TripTotal> list;
    for (auto& [period, total] : totals) {
        total.period = period;
        list.push_back(total);
    }
    return list;
}

Json totalsJson(std::vector<TripTotal> const& totals)
{
    Json list = Json::array();
    for (TripTotal const& total : totals) {
        list.push_back({{"period", total.period},
                        {"trips", total.trips},
                        {"distance_km", total.distanceKm},
                        {"duration_s", total.durationS},
                        {"fuel_l", total.fuelL > 0.0 ? Json(total.fuelL) : Json(nullptr)}});
    }
    return list;
}

} // namespace

double distanceOf(Trip const& trip)
{
    return trip.odometerKm && *trip.odometerKm >= sureOdometerKm ? *trip.odometerKm : trip.distanceKm;
}

std::optional<double> consumptionOf(double litres, double kilometres)
{
    return litres > 0.0 && kilometres >= 1.0 ? std::optional(litres / kilometres * 100.0) : std::nullopt;
}

std::vector<TripTotal> totalsByDay(std::vector<Trip> const& trips)
{
    return totalsBy(trips, "%Y-%m-%d");
}

std::vector<TripTotal> totalsByMonth(std::vector<Trip> const& trips)
{
    return totalsBy(trips, "%Y-%m");
}

std::string toJson(std::vector<Trip> const& trips)
{
    Json list = Json::array();
    for (Trip const& trip : trips) {
        list.push_back(toJsonValue(trip));
    }
    return printed(
        {{"trips", list}, {"days", totalsJson(totalsByDay(trips))}, {"months", totalsJson(totalsByMonth(trips))}});
}

} // namespace velmora
