#include "libvelmora/dash/dashstate.h"

#include "common/text/text.h"
#include "libvelmora/output/valuetext.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>

namespace velmora {

namespace {

constexpr std::size_t mostEvents = 50;
constexpr std::int64_t closestMs = 100; // points of a history

// With the digits that the value is good for.
Json valueOf(Reading const& reading)
{
    if (auto const number = numberOf(reading)) {
        return Json::parse(fmt::format("{:.{}f}", *number == 0.0 ? 0.0 : *number, std::clamp(reading.precision, 0, 9)));
    }
    std::string const* const text = std::get_if<std::string>(&reading.value);
    return text != nullptr ? Json(readable(*text)) : Json(nullptr);
}

Json toJson(SensorEntry const& entry)
{
    return {{"id", dashId(entry.module, entry.sensor)},
            {"module", moduleText(entry.module)},
            {"sensor", entry.sensor},
            {"pid", entry.pid},
            {"name", entry.name},
            {"unit", entry.unit}};
}

} // namespace

std::string dashId(unsigned int module, std::string const& sensor)
{
    return moduleText(module) + "/" + sensor;
}

Json beatJson(Health const& health, WallTime now)
{
    return {{"now", toMillis(now)},
            {"link", health.linkUp},
            {"state", health.state},
            {"trouble", textOrNull(health.trouble)},
            {"losses", health.linkLosses}};
}

void DashState::take(Reading const& reading)
{
    std::string const id = dashId(reading.module, reading.sensor);
    std::lock_guard const lock(m_mutex);
    if (m_sensors.size() >= mostSensors && !m_sensors.contains(id)) {
        return;
    }
    Sensor& sensor = m_sensors[id];
    bool const known = !sensor.about.is_null();
    if (!known || reading.precision > sensor.precision) {
        sensor.precision = reading.precision;
        sensor.about = toJson(SensorEntry{reading.module, reading.sensor, reading.pid, reading.name, reading.unit});
        sensor.about["precision"] = reading.precision;
        m_new.insert(id);
    }
    sensor.value = valueOf(reading);
    sensor.time = toMillis(reading.time);
    m_changed.insert(id);
    auto const number = numberOf(reading);
    std::deque<Point>& points = sensor.points;
    if (!number || (!points.empty() && std::abs(sensor.time - points.back().time) < closestMs)) {
        return;
    }
    points.push_back({sensor.time, *number});
    while (points.size() > mostPoints || points.front().time < sensor.time - std::chrono::milliseconds(kept).count()) {
        points.pop_front();
    }
}

void DashState::take(DashLine const& line)
{
    std::lock_guard const lock(m_mutex);
    m_lines.push_back({toMillis(line.time), line.sent ? ">" : "<", readable(line.text), ++m_lineNumber});
    m_newLines = std::min(m_newLines + 1, mostLines);
    if (m_lines.size() > mostLines) {
        m_lines.pop_front();
    }
}

void DashState::take(DashAnswer const& answer)
{
    std::lock_guard const lock(m_mutex);
    m_answers[answer.topic] = {{"topic", answer.topic},
                               {"time", toMillis(std::chrono::system_clock::now())},
                               {"done", answer.done},
                               {"data", answer.data}};
}

void DashState::take(DashVehicle const& vehicle)
{
    std::lock_guard const lock(m_mutex);
    if (m_vehicle.key != vehicle.key) {
        m_sensors.clear();
        m_changed.clear();
        m_new.clear();
        m_answers.clear();
    }
    m_vehicle = vehicle;
}

void DashState::take(Record const& record)
{
    std::lock_guard const lock(m_mutex);
    if (auto const* const change = std::get_if<CodeChange>(&record)) {
        std::string const key = fmt::format("{:X} {} {}", change->module, change->kind, change->code);
        if (change->present) {
            m_codes[key] = {{"module", moduleText(change->module)},
                            {"code", change->code},
                            {"kind", change->kind},
                            {"text", readable(change->text)}};
        } else {
            m_codes.erase(key);
        }
        m_news = true;
    } else if (auto const* const event = std::get_if<Event>(&record)) {
        m_events.push_back({{"time", toMillis(event->time)}, {"kind", event->kind}, {"text", readable(event->text)}});
        if (m_events.size() > mostEvents) {
            m_events.pop_front();
        }
        m_news = true;
    }
}

std::string DashState::vehicleKey() const
{
    std::lock_guard const lock(m_mutex);
    return m_vehicle.key;
}

Json DashState::valuesOf(std::set<std::string> const& ids, std::set<std::string> const& fresh) const
{
    Json values = Json::array();
    for (std::string const& id : ids) {
        Sensor const& sensor = m_sensors.at(id);
        values.push_back({id, sensor.time, sensor.value});
    }
    Json event = {{"v", std::move(values)}};
    if (!fresh.empty()) {
        event["sensors"] = Json::array();
        for (std::string const& id : fresh) {
            event["sensors"].push_back(m_sensors.at(id).about);
        }
    }
    return event;
}

std::string DashState::takeValues()
{
    std::lock_guard const lock(m_mutex);
    std::string const text = m_changed.empty() ? std::string() : dumpedJson(valuesOf(m_changed, m_new));
    m_changed.clear();
    m_new.clear();
    return text;
}

std::string DashState::allValues() const
{
    std::lock_guard const lock(m_mutex);
    std::set<std::string> ids;
    for (auto const& [id, sensor] : m_sensors) {
        ids.insert(id);
    }
    return dumpedJson(valuesOf(ids, ids));
}

std::string DashState::takeLines()
{
    std::lock_guard const lock(m_mutex);
    std::size_t const count = std::exchange(m_newLines, 0);
    return count == 0 ? std::string()
                      : dumpedJson(Json(std::vector<Json>(m_lines.end() - static_cast<long>(count), m_lines.end())));
}

std::string DashState::allLines() const
{
    std::lock_guard const lock(m_mutex);
    return dumpedJson(Json(m_lines));
}

bool DashState::takeNews()
{
    std::lock_guard const lock(m_mutex);
    return std::exchange(m_news, false);
}

Json DashState::news() const
{
    std::lock_guard const lock(m_mutex);
    Json codes = Json::array();
    for (auto const& [key, code] : m_codes) {
        codes.push_back(code);
    }
    return {{"codes", codes}, {"events", m_events}};
}

Json DashState::vehicle() const
{
    std::lock_guard const lock(m_mutex);
    Json offered = Json::array();
    for (SensorEntry const& each : m_vehicle.offered) {
        offered.push_back(toJson(each));
    }
    return {{"key", textOrNull(m_vehicle.key)}, {"offered", offered}};
}

Json DashState::answers() const
{
    std::lock_guard const lock(m_mutex);
    Json result = Json::object();
    for (auto const& [topic, answer] : m_answers) {
        if (topic != "console" && topic != "clear" && topic != "performance") {
            result[topic] = answer;
        }
    }
    return result;
}

} // namespace velmora
