#pragma once

#include "libvelmora/performance/sprint.h"

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
    enum class State
    {
        Moving,   // was not seen standing yet, so nothing can be timed from 0
        Standing, // ready
        Running,
        Stopped, // stands again after a run, whose times stay until the next start
    };

    // Power in kW and torque in Nm by engine speed.
    struct PowerPoint
    {
        double rpm = 0.0; // middle of its step
        double kilowatt = 0.0;
        double newtonMetre = 0.0;
    };

    static constexpr double rpmStep = 250.0;

    // In the order of their times, which count from any moment.
    void addSpeed(double seconds, double kmh);
    void addPower(double rpm, double kilowatt, double newtonMetre);
    void reset() { *this = {}; }

    State state() const { return m_state; }
    // The run, with its start reckoned back from the first readings that rise.
    std::vector<SpeedPoint> run() const;
    double kmh() const { return m_kmh; }
    // Mean seconds between two readings of the run; 0 before there are two.
    double interval() const;
    // The highest power of each step of the engine speed, rising.
    std::vector<PowerPoint> powers() const;

private:
    void begin(double seconds, double kmh);
    void goOn(double seconds, double kmh);
    void reckonStart();

    State m_state = State::Moving;
    double m_kmh = 0.0;
    double m_lastSeconds = 0.0; // of the last reading
    double m_lastStanding = 0.0;
    double m_firstSeconds = 0.0; // of the run's first reading above 0
    unsigned int m_readings = 0; // of the run
    std::vector<SpeedPoint> m_run;
    std::map<int, PowerPoint> m_powers; // by step
};

// Words for people: "standing, ready".
std::string stateText(PerformanceMeter::State state);

} // namespace velmora
