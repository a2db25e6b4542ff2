#include "libvelmora/output/ballast.h"
#include "libvelmora/output/metricfamily.h"
#include "libvelmora/output/recordtime.h"
#include "tests/support/filelimit.h"
#include "tests/support/openfiles.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/trips.h>

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <cmath>
#include <fstream>

namespace {

using namespace velmora;
using testsupport::march;

Trip tripOf(long long begin, double kilometres, std::optional<double> litres, std::optional<double> odometer = {})
{
    Trip trip;
    trip.begin = fromMillis(begin);
    trip.end = fromMillis(begin + 1000);
    trip.distanceKm = kilometres;
    trip.durationS = 60;
    trip.fuelL = litres;
    trip.odometerKm = odometer;
    return trip;
}

TEST(TripTotals, AreOfTripsThatBeganInADayOrMonth)
{
    long long const day = 86400000;
    Trip run = tripOf(march, 0.1, 5.0);
    run.engineRun = true;
    std::vector<Trip> const trips = {tripOf(march, 8.0, 0.5), tripOf(march + 1, 9.5, {}, 12.0), run,
                                     tripOf(march + 2 * day, 3.0, {}), tripOf(march + 40 * day, 1.0, 0.25)};
    std::vector<TripTotal> const days = totalsByDay(trips);
    ASSERT_EQ(days.size(), 3U);
    EXPECT_EQ(days[0].trips, 2);
    EXPECT_EQ(days[0].distanceKm, 20.0);
    EXPECT_EQ(days[0].durationS, 120.0);
    EXPECT_EQ(days[0].fuelL, 0.5);
    EXPECT_EQ(days[0].distanceWithFuelKm, 8.0);
    EXPECT_EQ(days[0].period.size(), 10U);
    EXPECT_EQ(days[1].distanceKm, 3.0);
    EXPECT_EQ(days[1].distanceWithFuelKm, 0.0);
    std::vector<TripTotal> const months = totalsByMonth(trips);
    ASSERT_EQ(months.size(), 2U);
    EXPECT_EQ(months[0].trips, 3);
    EXPECT_EQ(months[0].period, days[0].period.substr(0, 7));
    EXPECT_EQ(months[1].fuelL, 0.25);
    nlohmann::json const json = nlohmann::json::parse(toJson(trips));
    EXPECT_EQ(json["trips"].size(), 5U);
    EXPECT_EQ(
        json["days"][0],
        nlohmann::json(
            {{"period", days[0].period}, {"trips", 2}, {"distance_km", 20.0}, {"duration_s", 120.0}, {"fuel_l", 0.5}}));
    EXPECT_TRUE(json["days"][1]["fuel_l"].is_null()) << "nothing was told of it";
    EXPECT_EQ(json["months"].size(), 2U);
}

TEST(TripTotals, TakeTheOdometerFromTenKilometresOn)
{
    EXPECT_EQ(distanceOf(tripOf(march, 5.0, {}, 10.0)), 10.0);
    EXPECT_EQ(distanceOf(tripOf(march, 5.0, {}, 9.0)), 5.0);
    EXPECT_EQ(distanceOf(tripOf(march, 5.0, {})), 5.0);
    EXPECT_EQ(consumptionOf(5.0, 100.0), 5.0);
    EXPECT_EQ(consumptionOf(0.125, 1.0), 12.5);
    EXPECT_EQ(consumptionOf(0.07, 0.99), std::nullopt);
    EXPECT_EQ(consumptionOf(0.0, 5.0), std::nullopt);
}

TEST(RecordTime, IsTheEndOfATripAndMovesWhole)
{
    using std::chrono::milliseconds;
    Record const trip = tripOf(march, 1.0, {});
    EXPECT_EQ(timeOf(trip), fromMillis(march + 1000));
    Trip const moved = std::get<Trip>(shifted(trip, milliseconds(500)));
    EXPECT_EQ(moved.begin, fromMillis(march + 500));
    EXPECT_EQ(moved.end, fromMillis(march + 1500));
    EXPECT_EQ(timeOf(shifted(testsupport::reading("RPM", 1.0), milliseconds(-250))), fromMillis(march - 250));
}

TEST(Ballast, IsAFileBesideTheDatabase)
{
    testsupport::TemporaryFolder const folder;
    Ballast ballast(folder.file("a.db"), 4096);
    EXPECT_FALSE(ballast.drop()) << "there is none";
    EXPECT_TRUE(ballast.keep());
    EXPECT_TRUE(ballast.keep()) << "it is there";
    EXPECT_EQ(std::filesystem::file_size(folder.file("a.db-ballast")), 4096U);
    EXPECT_TRUE(ballast.drop());
    EXPECT_FALSE(std::filesystem::exists(folder.file("a.db-ballast")));
    Ballast huge(folder.file("b.db"), 1ULL << 60);
    EXPECT_FALSE(huge.keep()) << "no disk has four times as much free";
    EXPECT_FALSE(std::filesystem::exists(folder.file("b.db-ballast")));
    Ballast nowhere(folder.file("no/such/folder.db"), 4096);
    EXPECT_FALSE(nowhere.keep());
    EXPECT_TRUE(ballast.fits(4 * 4096));
    EXPECT_FALSE(ballast.fits(4 * 4096 - 1));
    EXPECT_FALSE(Ballast(folder.file("c.db"), 1ULL << 62).fits(1ULL << 62));
    EXPECT_FALSE(Ballast(folder.file("none.db"), ~0ULL).keep()) << "a size that also says that there is none";
    std::ofstream(folder.file("a.db-ballast")) << "x";
    EXPECT_TRUE(ballast.keep()) << "what is there of it is too small";
    EXPECT_EQ(std::filesystem::file_size(folder.file("a.db-ballast")), 4096U);
    EXPECT_FALSE(testsupport::isHeldOpen(folder.file("a.db-ballast")));
    unsigned long long const most = std::filesystem::space(folder.path()).available / 3;
    Ballast large(folder.file("d.db"), most);
    EXPECT_FALSE(large.keep());
    std::ofstream(folder.file("d.db-ballast")).close();
    std::filesystem::resize_file(folder.file("d.db-ballast"), most);
    EXPECT_TRUE(large.keep()) << "one that is there counts, on a full disk, too";
    testsupport::FileLimit const limit(2048);
    Ballast half(folder.file("e.db"), 4096);
    EXPECT_FALSE(half.keep());
    EXPECT_FALSE(std::filesystem::exists(folder.file("e.db-ballast"))) << "half of one is none";
}

// What one of the unit is in the base unit of its family, by the definitions of the units.
TEST(MetricFamily, HasBaseUnits)
{
    struct Case
    {
        char const* unit;
        char const* name;
        double one;
        double zero = 0.0;
    };
    Case const cases[] = {
        {"", "number", 1},
        {"rpm", "rotation_revolutions_per_minute", 1},
        {"km/h", "speed_meters_per_second", 0.277777778},
        {"mph", "speed_meters_per_second", 0.44704},
        {"V", "voltage_volts", 1},
        {"A", "current_amperes", 1},
        {"mA", "current_amperes", 0.001},
        {"µA", "current_amperes", 0.000001},
        {"Ω", "resistance_ohms", 1},
        {"kΩ", "resistance_ohms", 1000},
        {"s", "duration_seconds", 1},
        {"min", "duration_seconds", 60},
        {"%", "share_ratio", 0.01},
        {"ppm", "share_ratio", 0.000001},
        {"°C", "temperature_celsius", 1},
        {"°F", "temperature_celsius", -17.2222222, -17.7777778},
        {"K", "temperature_difference_celsius", 1},
        {"kPa", "pressure_pascals", 1000},
        {"Pa", "pressure_pascals", 1},
        {"psi", "pressure_pascals", 6894.757293},
        {"inHg", "pressure_pascals", 3386.389},
        {"inH2O", "pressure_pascals", 249.08891},
        {"kPa/s", "pressure_change_pascals_per_second", 1000},
        {"Pa/s", "pressure_change_pascals_per_second", 1},
        {"inH2O/s", "pressure_change_pascals_per_second", 249.08891},
        {"MHz", "frequency_hertz", 1e6},
        {"km", "distance_meters", 1000},
        {"mi", "distance_meters", 1609.344},
        {"mm", "length_meters", 0.001},
        {"in", "length_meters", 0.0254},
        {"V/ms", "voltage_change_volts_per_second", 1000},
        {"mV/s", "voltage_change_volts_per_second", 0.001},
        {"g/s", "mass_flow_grams_per_second", 1},
        {"kg/h", "mass_flow_grams_per_second", 0.277777778},
        {"lb/s", "mass_flow_grams_per_second", 453.59237},
        {"lb/min", "mass_flow_grams_per_second", 7.55987283},
        {"lb", "mass_grams", 453.59237},
        {"mg/stroke", "cylinder_charge_grams", 0.001},
        {"l/h", "volume_flow_liters_per_second", 0.000277777778},
        {"l/100 km", "consumption_liters_per_meter", 0.00001},
        {"mm²", "area_square_meters", 0.000001},
        {"lb-ft", "torque_newton_meters", 1.3558179483},
        {"kW", "power_watts", 1000},
        {"hp", "power_watts", 745.69987158},
        {"kJ", "energy_joules", 1000},
        {"BTU", "energy_joules", 1055.05585262},
        {"fur/14 Nights", "value_in_fur_14_nights", 1},
        {"AZaz09@[`{/:", "value_in_azaz09______", 1},
    };
    for (Case const& each : cases) {
        MetricFamily const family = metricFamily(each.unit);
        EXPECT_EQ(family.name, std::string("velmora_") + each.name) << each.unit;
        EXPECT_NEAR(family.factor + family.offset, each.one, std::abs(each.one) * 1e-7) << each.unit;
        EXPECT_NEAR(family.offset, each.zero, 1e-6) << each.unit;
    }
    EXPECT_EQ(escapedLabel("a\\b\"c\nd\re"), "a\\\\b\\\"c\\nd e");
}

} // namespace
