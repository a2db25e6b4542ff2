#pragma once

#include <velmora/performance.h>

#include <map>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// Times a vehicle by readings of its speed, which are whole km/h: from standing still, the way between the readings
// taken as a line. A new start forgets the run before. One thread.
class PerformanceMeter
{
public:
    static constexpr double rpmStep = 250.0;

    // In the order of their times, which count from any moment.
    void addSpeed(double seconds, double kmh);
    void addPower(double rpm, double kilowatt, double newtonMetre);
    void reset() { *this = {}; }

    RunState state() const { return m_state; }
    std::vector<SpeedPoint> points() const;
    double kmh() const { return m_kmh; }
    double interval() const;
    std::vector<PowerPoint> powers() const;
    // All of it. kilograms: the vehicle's weight that the powers were reckoned with.
    PerformanceRun run(int kilograms) const;

private:
    void begin(double seconds, double kmh);
    void goOn(double seconds, double kmh);
    void reckonStart();

    RunState m_state = RunState::Moving;
    double m_kmh = 0.0;
    double m_lastSeconds = 0.0; // of the last reading
    double m_lastStanding = 0.0;
    double m_firstSeconds = 0.0; // of the run's first reading above 0
    unsigned int m_readings = 0; // of the run
    std::vector<SpeedPoint> m_run;
    std::map<int, PowerPoint> m_powers; // by step
};

} // namespace velmora
