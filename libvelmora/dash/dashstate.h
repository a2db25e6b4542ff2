#pragma once

#include "libvelmora/dash/dashdesk.h"
#include "libvelmora/output/health.h"

#include <map>
#include <set>

namespace velmora {

// All that the page shows, as the events that browsers get. Any thread.
class DashState
{
public:
    static constexpr std::chrono::minutes kept{15};  // of each sensor's history
    static constexpr std::size_t mostPoints = 4000;  // of it
    static constexpr std::size_t mostSensors = 1000; // further ones are not shown
    static constexpr std::size_t mostLines = 300;    // of traffic

    void take(Reading const& reading);
    void take(DashLine const& line);
    void take(DashAnswer const& answer);
    void take(DashVehicle const& vehicle);
    // Codes, events and the list of sensors; others change nothing.
    void take(Record const& record);

    std::string vehicleKey() const;

    // What changed since the last call, as the data of one event; empty if nothing has.
    std::string takeValues();
    // Lines of traffic that came since the last call, as the data of one event; empty if none has.
    std::string takeLines();
    // Whether codes or events were told since the last call.
    bool takeNews();

    // All values, as takeValues gives them.
    std::string allValues() const;
    std::string allLines() const;
    Json news() const;
    Json vehicle() const;
    // By topic.
    Json answers() const;
    // {"t": milliseconds, "v": numbers} of one sensor, thinned to so many points with its peaks kept.
    Json history(std::string const& id, std::size_t points) const;

private:
    struct Point
    {
        std::int64_t time;
        double value;
    };
    struct Sensor
    {
        Json about;
        Json value;
        std::int64_t time = 0;
        int precision = 0;
        std::deque<Point> points;
    };

    Json valuesOf(std::set<std::string> const& ids, std::set<std::string> const& fresh) const;

    mutable std::mutex m_mutex; // protects all below
    DashVehicle m_vehicle;
    std::map<std::string, Sensor> m_sensors; // by id
    std::set<std::string> m_changed;
    std::set<std::string> m_new;
    std::map<std::string, Json> m_codes; // by module, kind and code
    std::deque<Json> m_events;
    bool m_news = false;
    std::map<std::string, Json> m_answers;
    std::deque<Json> m_lines;
    std::size_t m_newLines = 0;
    std::uint64_t m_lineNumber = 0; // of the last line; goes with it, so that nobody takes a line twice
};

// How a sensor is called between page and program: "7E8/RPM".
std::string dashId(unsigned int module, std::string const& sensor);

// The data of the event that comes each second.
Json beatJson(Health const& health, WallTime now);

} // namespace velmora
