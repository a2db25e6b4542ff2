#pragma once

#include "program/view/framestyle.h"

#include <obd/sensordatamodels.h>
#include <velmora/limits.h>
#include <velmora/live.h>

#include <chrono>
#include <deque>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace velmora::cli {

// One sensor with what is known of it. Texts are empty where nothing is known, for a sensor that the vehicle no longer
// answers for too.
struct LiveRow
{
    int uid = 0;
    unsigned int module = 0;
    std::string name; // with the module's id in front where there are several
    std::string unit;
    std::string metricUnit;
    std::string key; // of its sensor, for settings and recordings: "RPM", "LAMBDA_2", or a signal's own
    bool isSignal = false;
    std::string request; // of a signal, hexadecimal
    bool numeric = false;
    std::string value;
    std::string minimum;
    std::string mean;
    std::string maximum;
    std::string last;            // the value before it was gone; empty while there is one
    std::deque<double> trend;    // means of LiveTable::trendStep, oldest first; NaN for one without readings
    LiveTime updated;            // when a value came last
    LiveTime trendTime;          // when the newest mean began
    unsigned int trendCount = 0; // readings in it
    LiveTime::duration period;   // how far apart its readings are to be; 0 for as close as can be
    SensorLimit limit;           // in the row's unit

    bool isOutside() const;
};

// The live values of the selected parameters, in the order of their selection.
class LiveTable
{
public:
    static constexpr std::size_t trendLength = 60;
    static constexpr std::chrono::seconds trendStep{5};

    using Parameters = std::vector<LiveParameter>;
    using Values = std::vector<std::shared_ptr<obd::SensorValueDataModel>>;

    // Starts anew, with other parameters or other units.
    void select(Parameters const& parameters);

    // From now on, until others are selected.
    void setLimits(std::function<SensorLimit(LiveRow const& row)> const& limitOf);

    // Takes a reading of a parameter; a sensor that is not among the values has none any more. Of a parameter that was
    // not selected nothing is taken.
    void update(int pid, Values const& values, LiveTime now, unsigned int module = 0);

    // Forgets the values that are too old to be shown as current: by some rounds of all sensors, and some seconds.
    void expire(LiveTime now);

    std::vector<LiveRow> const& rows() const { return m_rows; }
    // The rows of one parameter.
    std::vector<LiveRow const*> rowsOf(int pid, unsigned int module = 0) const;

    // How often all parameters have had their turn. One that the vehicle doesn't answer for has had it when another one
    // comes again.
    unsigned long rounds() const { return m_rounds; }
    // Whether a reading of this parameter would begin the next round.
    bool beginsRound(int pid, unsigned int module = 0) const { return m_seen.contains({module, pid}); }
    // All readings so far.
    unsigned long readings() const { return m_readings; }

private:
    using Key = std::pair<unsigned int, int>; // module and PID

    void countRound(Key key, LiveTime now);
    void endRound(LiveTime now);

    std::vector<LiveRow> m_rows;
    std::set<Key> m_selected;
    std::set<Key> m_seen; // in this round
    unsigned long m_rounds = 0;
    unsigned long m_readings = 0;
    LiveTime m_roundStart;
    LiveTime m_lastReading;
    LiveTime::duration m_roundLength{0};
};

// "Engine RPM (rpm)", or the name alone.
std::string nameWithUnit(LiveRow const& row);

// The text, or "-" where there is none.
std::string orDash(std::string const& text);

} // namespace velmora::cli
