#pragma once

#include <obd/diagnosticdatamodels.h>
#include <obd/oxygensensorlocation.h>
#include <velmora/export.h>
#include <velmora/troublecode.h>

#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

/// What one control module told of one topic.
template <typename Report>
struct ModuleTopic
{
    unsigned int id;
    std::string name;
    Report report;
};

/// A test that a control module made on itself, with its result as text. Empty limits are none.
struct LimitTest
{
    enum class Verdict
    {
        Failed,
        Passed,
        NoResult, ///< not run since the codes were cleared
        None,     ///< a constant, with no limits to judge by
    };

    int id;
    std::string description;
    std::string value;
    std::string minimum;
    std::string maximum;
    std::string unit;
    Verdict verdict;
};

/// An on-board monitor with the results of its tests.
struct OnBoardMonitor
{
    int id;
    std::string description;
    std::vector<LimitTest> tests;
};

/// The results of on-board tests, service 06 on CAN.
struct MonitorsReport
{
    TopicAnswer answer = TopicAnswer::NotOffered;
    std::vector<OnBoardMonitor> monitors;
};

/// An oxygen sensor with the tests that the module made on it.
struct OxygenSensor
{
    obd::OxygenSensorLocation location;
    std::vector<LimitTest> tests;
};

/// The oxygen sensors of one control module.
struct OxygenReport
{
    TopicAnswer answer = TopicAnswer::NotOffered;
    std::optional<bool> complete; ///< whether the monitor has run since the codes were cleared
    bool onCan = false;           ///< where the tests are among those of the monitors
    std::vector<OxygenSensor> sensors;
};

/// What the vehicle froze when a code was set.
struct FreezeFrame
{
    struct Reading
    {
        std::string name;
        std::optional<std::string> value; ///< nothing if the module did not tell it
        std::string unit;
    };

    TroubleCode code;
    std::vector<Reading> readings;
};

/// One frame of a control module, by number.
struct FreezeReport
{
    unsigned int number = 0;
    TopicAnswer answer = TopicAnswer::NotOffered; ///< whether the module told what its frame holds
    std::optional<FreezeFrame> frame;
};

/// Complete, NotComplete, DisabledThisCycle or NotAvailable.
using ReadinessStatus = obd::ReadinessMonitorDataModel::Status;

/// One monitor of the emission system.
struct ReadinessMonitor
{
    std::string name;
    ReadinessStatus sinceCleared;
    std::optional<ReadinessStatus> thisCycle; ///< nothing if the module does not tell it
};

/// Which monitors have run, as an emissions test asks for.
struct ReadinessReport
{
    TopicAnswer answer = TopicAnswer::NotOffered;
    std::optional<bool> lamp;
    std::vector<ReadinessMonitor> monitors;
};

/// How often monitors could run and did.
struct CountersReport
{
    struct Counter
    {
        std::string name;
        unsigned int value;
    };

    TopicAnswer answer = TopicAnswer::NotOffered;
    std::vector<Counter> counters; ///< those that are not 0
};

/// What a control module tells of itself and the vehicle. Empty texts and missing values were not told.
struct InfoReport
{
    struct Calibration
    {
        std::string id;
        std::string verification; ///< the checksum of what the id names
    };

    struct Reading
    {
        std::string value;
        std::string unit;
    };

    struct Travel
    {
        std::optional<Reading> distance;
        std::optional<Reading> runTime;
    };

    std::string description;
    std::string standard;
    std::string protocol;
    std::string vin;
    std::vector<Calibration> calibrations;
    std::string engineSerialNumber;
    std::string erotan; ///< exhaust regulation or type approval number
    Travel withLamp;    ///< since the lamp came on
    Travel sinceCleared;
};

/// "read", "not supported", "no answer", "unreadable" or "refused".
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, TopicAnswer answer);
/// "passed: Catalyst efficiency 0.4 (0 to 1) V"
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, LimitTest const& test);
/// "P0171 System Too Lean Bank 1", then a line for each reading.
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, FreezeFrame const& frame);
/// "Misfire: complete"
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, ReadinessMonitor const& monitor);
/// A line for each monitor, or why there are none; the last line without its line feed, as with all reports.
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, ReadinessReport const& report);
/// A line for each test, or why there are none.
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, MonitorsReport const& report);
/// The frame, or why there is none.
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, FreezeReport const& report);
/// A line for each text that was told.
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, InfoReport const& report);
/// A line for each counter, or why there are none.
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, CountersReport const& report);
/// A line for each sensor and for each test of it, or why there are none.
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, OxygenReport const& report);
/// Lamp and codes, a line each.
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, CodeReport const& report);

/// "7E8 ECM" and a line feed.
VELMORA_EXPORT std::ostream& writeModule(std::ostream& out, unsigned int id, std::string const& name);

/// "7E8 ECM", and behind it the report on lines of its own.
template <typename Report>
std::ostream& operator<<(std::ostream& out, ModuleTopic<Report> const& topic)
{
    return writeModule(out, topic.id, topic.name) << topic.report;
}

} // namespace velmora
