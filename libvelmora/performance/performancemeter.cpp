#include "libvelmora/performance/performancemeter.h"

#include <algorithm>
#include <cmath>

namespace velmora {

namespace {

constexpr double steadyAfter = 1.0;      // seconds without a change; slow modules take half of one for a new value
constexpr double longestRenewal = 0.5;   // seconds that a module takes for a new value
constexpr double longestStart = 2.0;     // seconds from standing to the first reading above 0
constexpr std::size_t mostPoints = 5000; // of one run

} // namespace

void PerformanceMeter::addSpeed(double seconds, double kmh)
{
    bool const stood = m_state == RunState::Standing || m_state == RunState::Stopped;
    if (kmh <= 0.0) {
        if (m_state == RunState::Running) {
            goOn(seconds, kmh);
        }
        m_state = m_state == RunState::Running || m_state == RunState::Stopped ? RunState::Stopped : RunState::Standing;
        m_lastStanding = seconds;
    } else if (stood) {
        begin(seconds, kmh);
    } else if (m_state == RunState::Running) {
        goOn(seconds, kmh);
    }
    m_kmh = kmh;
    m_lastSeconds = seconds;
}

void PerformanceMeter::begin(double seconds, double kmh)
{
    m_state = RunState::Running;
    m_firstSeconds = seconds;
    m_readings = 1;
    m_powers.clear();
    m_run = {{std::max(m_lastStanding, seconds - longestStart), 0.0}, {seconds, kmh}};
}

// A value that is repeated is the module's, not the vehicle's: it counts from when it came first. One that stays for
// long is a steady speed.
void PerformanceMeter::goOn(double seconds, double kmh)
{
    ++m_readings;
    if (kmh == m_kmh || m_run.size() >= mostPoints) {
        return;
    }
    if (m_lastSeconds - m_run.back().seconds > steadyAfter) {
        m_run.push_back({m_lastSeconds, m_kmh});
    }
    m_run.push_back({seconds, kmh});
    if (m_run.size() == 3) {
        reckonStart();
    }
}

// The first reading above 0 comes late. The line through the first two that rise meets 0 where the vehicle began to
// roll, but not before it was last seen standing; a module that renews its speed seldom told that of some time before.
void PerformanceMeter::reckonStart()
{
    SpeedPoint const& first = m_run[1];
    SpeedPoint const& second = m_run[2];
    if (second.kmh > first.kmh && second.seconds > first.seconds) {
        double const step = second.seconds - first.seconds;
        double const earliest = m_run[0].seconds - std::min(step, longestRenewal);
        m_run[0].seconds =
            std::clamp(first.seconds - first.kmh / (second.kmh - first.kmh) * step, earliest, first.seconds);
    }
}

// With the way since the last change, where the speed has been steady for long.
std::vector<SpeedPoint> PerformanceMeter::points() const
{
    std::vector<SpeedPoint> points = m_run;
    if (m_state == RunState::Running && m_lastSeconds - points.back().seconds > steadyAfter) {
        points.push_back({m_lastSeconds, m_kmh});
    }
    return points;
}

double PerformanceMeter::interval() const
{
    return m_readings < 2 ? 0.0 : (m_lastSeconds - m_firstSeconds) / (m_readings - 1);
}

void PerformanceMeter::addPower(double rpm, double kilowatt, double newtonMetre)
{
    if (m_state != RunState::Running || !(rpm > 0.0) || !(kilowatt > 0.0)) {
        return;
    }
    int const step = static_cast<int>(rpm / rpmStep);
    PowerPoint& point = m_powers[step];
    if (kilowatt > point.kilowatt) {
        point = {(step + 0.5) * rpmStep, kilowatt, newtonMetre};
    }
}

std::vector<PowerPoint> PerformanceMeter::powers() const
{
    std::vector<PowerPoint> points;
    for (auto const& [step, point] : m_powers) {
        points.push_back(point);
    }
    return points;
}

PerformanceRun PerformanceMeter::run(int kilograms) const
{
    return {m_state, m_kmh, points(), interval(), powers(), kilograms};
}

std::string stateText(RunState state)
{
    switch (state) {
    case RunState::Moving:
        return "stand still to be ready";
    case RunState::Standing:
        return "standing, ready";
    case RunState::Running:
        return "running";
    case RunState::Stopped:
        return "standing, ready for the next run";
    }
    return {};
}

} // namespace velmora
