#include "libvelmora/watch/tripmeter.h"

#include <algorithm>

namespace velmora {

namespace {

constexpr int signsToBegin = 2; // in a row: a single one may be noise, or a starter that failed

double secondsOf(SteadyTime::duration duration)
{
    return std::chrono::duration<double>(duration).count();
}

void raise(std::optional<double>& highest, double value)
{
    highest = std::max(highest.value_or(value), value);
}

} // namespace

void TripMeter::begin(WatchTime const& now)
{
    m_trip = Trip();
    m_trip->vehicle = m_vehicle;
    m_trip->begin = now.wall;
    m_begin = now.steady;
    m_speed.reset();
    m_fuel.reset();
    m_odometerBegin.reset();
}

void TripMeter::sign(bool positive, int& inARow, WatchTime const& now)
{
    inARow = positive ? inARow + 1 : 0;
    if (!positive) {
        return;
    }
    m_lastSign = now.steady;
    if (!m_trip && inARow >= signsToBegin) {
        begin(now);
    }
}

void TripMeter::onEngineSpeed(double rpm, WatchTime const& now)
{
    m_rpm = rpm;
    m_rpmTime = now.steady;
    sign(rpm > 0.0, m_turns, now);
    if (m_trip) {
        raise(m_trip->maxRpm, rpm);
    }
}

void TripMeter::onVehicleSpeed(double kmh, WatchTime const& now)
{
    sign(kmh > 0.0, m_moves, now);
    if (m_trip) {
        addSpeed(kmh, now.steady);
    }
}

void TripMeter::addSpeed(double kmh, SteadyTime now)
{
    if (m_speed && now - m_speed->time <= m_settings.longestGap) {
        double const seconds = secondsOf(now - m_speed->time);
        m_trip->distanceKm += (m_speed->value + kmh) / 2.0 * seconds / 3600.0;
        bool const turning = m_rpm > 0.0 && now - m_rpmTime <= m_settings.longestGap;
        if (turning && m_speed->value < m_settings.idleBelowKmh && kmh < m_settings.idleBelowKmh) {
            m_trip->idleS += seconds;
        }
    } else {
        m_trip->gapS += secondsOf(now - (m_speed ? m_speed->time : m_begin));
    }
    m_speed = Sample{kmh, now};
    raise(m_trip->maxKmh, kmh);
}

void TripMeter::onFuelRate(double litresPerHour, WatchTime const& now)
{
    if (!m_trip) {
        return;
    }
    if (m_fuel && now.steady - m_fuel->time <= m_settings.longestGap) {
        double const hours = secondsOf(now.steady - m_fuel->time) / 3600.0;
        m_trip->fuelL = m_trip->fuelL.value_or(0.0) + (m_fuel->value + litresPerHour) / 2.0 * hours;
    }
    m_fuel = Sample{litresPerHour, now.steady};
}

void TripMeter::onCoolant(double celsius)
{
    if (m_trip) {
        raise(m_trip->maxCoolantC, celsius);
    }
}

void TripMeter::onOdometer(double km)
{
    if (!m_trip) {
        return;
    }
    if (!m_odometerBegin || km < *m_odometerBegin) { // counters since codes were cleared fall to 0
        m_odometerBegin = km;
    }
    m_trip->odometerKm = km - *m_odometerBegin;
}

void TripMeter::onClockSet(std::chrono::milliseconds step)
{
    if (m_trip) {
        m_trip->begin += step;
    }
}

std::optional<Trip> TripMeter::onTime(WatchTime const& now)
{
    return m_trip && now.steady - m_lastSign >= m_settings.endAfter ? finish() : std::nullopt;
}

// The time that it took to notice the end is no part of the trip.
std::optional<Trip> TripMeter::finish()
{
    m_turns = 0;
    m_moves = 0;
    if (!m_trip) {
        return std::nullopt;
    }
    Trip trip = *m_trip;
    m_trip.reset();
    trip.durationS = secondsOf(m_lastSign - m_begin);
    trip.end = trip.begin + std::chrono::duration_cast<WallTime::duration>(m_lastSign - m_begin);
    if (!m_speed) {
        trip.gapS = trip.durationS;
    }
    trip.gapS = std::min(trip.gapS, trip.durationS);
    trip.idleS = std::min(trip.idleS, trip.durationS);
    double const measured = trip.durationS - trip.gapS;
    if (m_speed && measured > 0.0) {
        trip.meanKmh = trip.distanceKm / measured * 3600.0;
    }
    trip.engineRun = trip.distanceKm < m_settings.shortestKm || trip.durationS < secondsOf(m_settings.shortestTime);
    return trip;
}

} // namespace velmora
