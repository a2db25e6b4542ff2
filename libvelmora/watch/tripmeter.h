#pragma once

#include "libvelmora/watch/watchtime.h"

#include <optional>
#include <string>

namespace velmora {

struct TripSettings
{
    std::chrono::seconds endAfter{120}; // engine off or silent: pauses of start-stop systems are shorter
    std::chrono::seconds longestGap{5}; // between two speeds that a line may be drawn between
    double idleBelowKmh = 2.0;
    double shortestKm = 0.2; // less is an engine run, as is a shorter time
    std::chrono::seconds shortestTime{30};
};

// Makes trips of what the vehicle tells while it runs. Reads no clock.
class TripMeter
{
public:
    explicit TripMeter(std::string vehicle, TripSettings const& settings = {})
        : m_settings(settings), m_vehicle(std::move(vehicle))
    {}

    void onEngineSpeed(double rpm, WatchTime const& now);
    void onVehicleSpeed(double kmh, WatchTime const& now);
    void onFuelRate(double litresPerHour, WatchTime const& now);
    void onCoolant(double celsius);
    void onOdometer(double km);
    // The wall clock was set by so much: the trip under way began at another time than it told.
    void onClockSet(std::chrono::milliseconds step);

    // Whether a trip is under way.
    bool underway() const { return m_trip.has_value(); }
    // The trip that has ended by now. Call it often.
    std::optional<Trip> onTime(WatchTime const& now);
    // Ends what is under way, because the watch does.
    std::optional<Trip> finish();

private:
    struct Sample
    {
        double value = 0.0;
        SteadyTime time;
    };

    void sign(bool positive, int& inARow, WatchTime const& now);
    void begin(WatchTime const& now);
    void addSpeed(double kmh, SteadyTime now);
    void addIdle(SteadyTime now);

    TripSettings const m_settings;
    std::string const m_vehicle;
    std::optional<Trip> m_trip;
    SteadyTime m_begin;
    SteadyTime m_lastSign;
    int m_turns = 0; // engine speeds above 0 in a row
    int m_moves = 0; // speeds above 0 in a row
    double m_rpm = 0.0;
    SteadyTime m_rpmTime;
    std::optional<Sample> m_speed;
    std::optional<Sample> m_fuel;
    std::optional<double> m_odometerBegin;
};

} // namespace velmora
