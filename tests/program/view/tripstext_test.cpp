#include "libvelmora/output/valuetext.h"
#include "program/view/tripstext.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <cstdlib>
#include <ctime>

namespace {

using testing::HasSubstr;
using velmora::Trip;

// Two hours ahead of UTC in summer, one in winter.
class TripsText : public testing::Test
{
protected:
    TripsText()
    {
        ::setenv("TZ", "CET-1CEST,M3.5.0,M10.5.0/3", 1);
        ::tzset();
    }
    ~TripsText() override
    {
        ::unsetenv("TZ");
        ::tzset();
    }

    static Trip tripAt(std::int64_t begin, double km, std::optional<double> litres = {}, bool run = false)
    {
        Trip trip;
        trip.begin = velmora::fromMillis(begin);
        trip.end = velmora::fromMillis(begin + 1800000);
        trip.vehicle = "van";
        trip.distanceKm = km;
        trip.durationS = 1800.0;
        trip.fuelL = litres;
        trip.engineRun = run;
        return trip;
    }

    std::vector<Trip> const m_trips = {
        tripAt(1774992600000, 10.0, 1.0),      // 2026-03-31T21:30Z, 23:30 of that day here
        tripAt(1774996200000, 20.0),           // 22:30Z, which is April here; told no fuel
        tripAt(1775030000000, 30.0, 3.0),      // April 1st, in the morning
        tripAt(1775040000000, 0.1, 0.2, true), // the engine ran: no trip
    };
};

TEST_F(TripsText, TotalsAreByTheDayAndMonthInWhichATripBeganHere)
{
    nlohmann::json const document = nlohmann::json::parse(velmora::toJson(m_trips));
    EXPECT_EQ(document["trips"].size(), 4U);
    EXPECT_EQ(document["days"], nlohmann::json::parse(R"([
        {"period": "2026-03-31", "trips": 1, "distance_km": 10.0, "duration_s": 1800.0, "fuel_l": 1.0},
        {"period": "2026-04-01", "trips": 2, "distance_km": 50.0, "duration_s": 3600.0, "fuel_l": 3.0}])"));
    EXPECT_EQ(document["months"], nlohmann::json::parse(R"([
        {"period": "2026-03", "trips": 1, "distance_km": 10.0, "duration_s": 1800.0, "fuel_l": 1.0},
        {"period": "2026-04", "trips": 2, "distance_km": 50.0, "duration_s": 3600.0, "fuel_l": 3.0}])"));
}

TEST_F(TripsText, ConsumptionIsOfTheTripsThatToldTheirFuel)
{
    std::string const text = velmora::cli::tripsText(m_trips);
    EXPECT_THAT(text,
                HasSubstr("2026-03-31 23:30   van               10.0    0:30    0:00       -     1.00     10.0\n"));
    EXPECT_THAT(text, HasSubstr("0.20        -  engine run\n"));
    EXPECT_THAT(text, HasSubstr("2026-04                 2      50.0    1:00     3.0     10.0\n"));
    EXPECT_EQ(velmora::cli::tripsText({}), "No trips yet\n");
    EXPECT_THAT(
        velmora::cli::tripsCsv(m_trips),
        HasSubstr("2026-03-31T21:30:00.000Z,2026-03-31T22:00:00.000Z,van,trip,10.000,-,1800,0,0,1.000,-,-,-,-\n"));
}

TEST_F(TripsText, AnEngineThatRanHasNoConsumption)
{
    EXPECT_THAT(velmora::cli::tripsText({tripAt(1774992600000, 20.0, 2.0, true)}),
                HasSubstr("     2.00        -  engine run\n"));
    EXPECT_THAT(velmora::cli::tripsText({tripAt(1774992600000, 20.0, 2.0)}), HasSubstr("     2.00     10.0\n"));
}

TEST_F(TripsText, EachColumnHasItsUnitAndDigits)
{
    Trip trip = tripAt(1774992600000, 123.456, 10.055);
    trip.durationS = 5430.4;
    trip.idleS = 89.9;
    trip.gapS = 12.6;
    trip.odometerKm = 124.4;
    trip.meanKmh = 81.84;
    trip.maxKmh = 131.6;
    trip.maxRpm = 3999.6;
    trip.maxCoolantC = 91.4;
    EXPECT_EQ(velmora::cli::tripsText({trip, m_trips[3]}),
              R"(Begin              Vehicle             km   h:min    idle     max        l l/100 km
2026-03-31 23:30   van              124.4    1:31    0:01     132    10.05      8.1
2026-04-01 12:40   van                0.1    0:30    0:00       -     0.20        -  engine run

Day                 Trips        km   h:min       l l/100 km
2026-03-31              1     124.4    1:31    10.1      8.1

Month               Trips        km   h:min       l l/100 km
2026-03                 1     124.4    1:31    10.1      8.1
)");
    EXPECT_EQ(
        velmora::cli::tripsCsv({trip, m_trips[3]}),
        R"(begin,end,vehicle,kind,distance_km,odometer_km,duration_s,idle_s,gap_s,fuel_l,mean_kmh,max_kmh,max_rpm,max_coolant_c
2026-03-31T21:30:00.000Z,2026-03-31T22:00:00.000Z,van,trip,123.456,124,5430,90,13,10.055,81.8,132,4000,91
2026-04-01T10:40:00.000Z,2026-04-01T11:10:00.000Z,van,engine run,0.100,-,1800,0,0,0.200,-,-,-,-
)");
}

} // namespace
