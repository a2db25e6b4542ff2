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
    unsigned int id;  ///< of the control module, such as 0x7E8
    std::string name; ///< such as "ECM"
    Report report;    ///< what it told
};

/// A test that a control module made on itself, with its result as text. Empty limits are none.
struct LimitTest
{
    /// How the test has ended.
    enum class Verdict
    {
        Failed,
        Passed,
        NoResult, ///< not run since the codes were cleared
        None,     ///< a constant, with no limits to judge by
    };

    int id;                  ///< test identifier
    std::string description; ///< what was tested
    std::string value;       ///< the result, without its unit
    std::string minimum;     ///< empty for none
    std::string maximum;     ///< empty for none
    std::string unit;        ///< label; empty for none
    Verdict verdict;         ///< by value and limits
};

/// An on-board monitor with the results of its tests.
struct OnBoardMonitor
{
    int id;                       ///< monitor identifier
    std::string description;      ///< what is monitored
    std::vector<LimitTest> tests; ///< in the order of the reply
};

/// The results of on-board tests, service 06 on CAN.
struct MonitorsReport
{
    TopicAnswer answer = TopicAnswer::NotOffered; ///< whether the module told its monitors
    std::vector<OnBoardMonitor> monitors;         ///< those that it told
};

/// An oxygen sensor with the tests that the module made on it.
struct OxygenSensor
{
    obd::OxygenSensorLocation location; ///< bank and position
    std::vector<LimitTest> tests;       ///< on legacy buses alone
};

/// The oxygen sensors of one control module.
struct OxygenReport
{
    TopicAnswer answer = TopicAnswer::NotOffered; ///< whether the module told its sensors
    std::optional<bool> complete;                 ///< whether the monitor has run since the codes were cleared
    bool onCan = false;                           ///< where the tests are among those of the monitors
    std::vector<OxygenSensor> sensors;            ///< those that it told
};

/// What the vehicle froze when a code was set.
struct FreezeFrame
{
    /// One value of the frame.
    struct Reading
    {
        std::string name;                 ///< title for people
        std::optional<std::string> value; ///< nothing if the module did not tell it
        std::string unit;                 ///< label; empty for none
    };

    TroubleCode code;              ///< the one that caused the frame
    std::vector<Reading> readings; ///< what the frame holds beside it
};

/// One frame of a control module, by number.
struct FreezeReport
{
    unsigned int number = 0;                      ///< of the frame, 0 to 255
    TopicAnswer answer = TopicAnswer::NotOffered; ///< whether the module told what its frame holds
    std::optional<FreezeFrame> frame;             ///< nothing if none is stored, or none was told
};

/// Complete, NotComplete, DisabledThisCycle or NotAvailable.
using ReadinessStatus = obd::ReadinessMonitorDataModel::Status;

/// One monitor of the emission system.
struct ReadinessMonitor
{
    std::string name;                         ///< "Misfire"
    ReadinessStatus sinceCleared;             ///< since the codes were cleared
    std::optional<ReadinessStatus> thisCycle; ///< nothing if the module does not tell it
};

/// Which monitors have run, as an emissions test asks for.
struct ReadinessReport
{
    TopicAnswer answer = TopicAnswer::NotOffered; ///< whether the module told its monitors
    std::optional<bool> lamp;               ///< whether the malfunction indicator is on; nothing if that was not told
    std::vector<ReadinessMonitor> monitors; ///< those that an engine of its kind can have
};

/// How often monitors could run and did.
struct CountersReport
{
    /// One counter of in-use performance.
    struct Counter
    {
        std::string name;   ///< title for people
        unsigned int value; ///< how often
    };

    TopicAnswer answer = TopicAnswer::NotOffered; ///< whether the module told its counters
    std::vector<Counter> counters;                ///< those that are not 0
};

/// What a control module tells of itself and the vehicle. Empty texts and missing values were not told.
struct InfoReport
{
    /// A software or a set of data of the module.
    struct Calibration
    {
        std::string id;           ///< its name, as the maker gives it
        std::string verification; ///< the checksum of what the id names
    };

    /// A value as people write it.
    struct Reading
    {
        std::string value; ///< digits
        std::string unit;  ///< label
    };

    /// How far, and for how long the engine ran.
    struct Travel
    {
        std::optional<Reading> distance; ///< driven
        std::optional<Reading> runTime;  ///< of the engine
    };

    std::string description;               ///< long name of the module
    std::string standard;                  ///< that it reports to meet, such as "EOBD"
    std::string protocol;                  ///< of its bus
    std::string vin;                       ///< vehicle identification number
    std::vector<Calibration> calibrations; ///< in the order of the reply
    std::string engineSerialNumber;        ///< as the maker gives it
    std::string erotan;                    ///< exhaust regulation or type approval number
    Travel withLamp;                       ///< since the lamp came on
    Travel sinceCleared;                   ///< since the codes were cleared
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
