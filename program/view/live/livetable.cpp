#include "program/view/live/livetable.h"

#include "common/text/text.h"

#include <obd/parameteridentifier.h>

#include <fmt/format.h>

#include <algorithm>
#include <limits>

namespace velmora::cli {

namespace {

constexpr std::chrono::seconds patience{2};
constexpr int patienceRounds = 3;

LiveRow makeRow(LiveSensor const& sensor, bool several)
{
    LiveRow row{};
    row.uid = sensor.uid;
    row.module = sensor.module;
    if (sensor.hertz) {
        row.period = std::chrono::duration_cast<LiveTime::duration>(std::chrono::duration<double>(1.0 / *sensor.hertz));
    }
    bool const named = several && (!sensor.isSignal || sensor.module != 0);
    row.name = named ? fmt::format("{:X} {}", sensor.module, sensor.name) : sensor.name;
    row.unit = sensor.unit;
    row.metricUnit = sensor.metricUnit;
    row.key = sensor.key;
    row.isSignal = sensor.isSignal;
    row.request = sensor.request;
    row.numeric = sensor.numeric;
    return row;
}

// The module of a parameter is that of each of its sensors.
bool ofSeveralModules(LiveTable::Parameters const& parameters)
{
    std::set<unsigned int> modules;
    for (LiveParameter const& parameter : parameters) {
        for (LiveSensor const& sensor : parameter) {
            modules.insert(sensor.module);
        }
    }
    return modules.size() > 1;
}

// Begins the means up to that of now; those between have no readings.
void beginMeans(LiveRow& row, LiveTime now)
{
    if (row.trend.empty() || now - row.trendTime >= LiveTable::trendStep * static_cast<int>(LiveTable::trendLength)) {
        row.trend.assign(1, std::numeric_limits<double>::quiet_NaN());
        row.trendTime = now;
        row.trendCount = 0;
    }
    while (now - row.trendTime >= LiveTable::trendStep) {
        row.trend.push_back(std::numeric_limits<double>::quiet_NaN());
        row.trendTime += LiveTable::trendStep;
        row.trendCount = 0;
    }
    while (row.trend.size() > LiveTable::trendLength) {
        row.trend.pop_front();
    }
}

void addTrend(LiveRow& row, LiveTime now)
{
    std::optional<double> const number = numberIn(row.value);
    if (!number) {
        return; // such as the fuel consumption of air with a lambda of 0
    }
    beginMeans(row, now);
    double& mean = row.trend.back();
    mean = row.trendCount == 0 ? *number : mean + (*number - mean) / (row.trendCount + 1.0);
    ++row.trendCount;
}

void forget(LiveRow& row)
{
    if (!row.value.empty()) {
        row.last = std::exchange(row.value, {});
    }
}

void take(LiveRow& row, obd::SensorValueDataModel const& value, LiveTime now)
{
    row.value = value.value;
    row.last.clear();
    row.minimum = value.minimum;
    row.mean = value.mean;
    row.maximum = value.maximum;
    row.updated = now;
    if (row.numeric) {
        addTrend(row, now);
    }
}

} // namespace

bool LiveRow::isOutside() const
{
    std::optional<double> const number = numeric ? numberIn(value) : std::nullopt;
    return number && limit.isOutside(*number);
}

void LiveTable::setLimits(std::function<SensorLimit(LiveRow const& row)> const& limitOf)
{
    for (LiveRow& row : m_rows) {
        row.limit = limitOf(row);
    }
}

void LiveTable::select(Parameters const& parameters)
{
    m_rows.clear();
    m_selected.clear();
    m_seen.clear();
    m_roundLength = {};
    bool const several = ofSeveralModules(parameters);
    for (LiveParameter const& parameter : parameters) {
        for (LiveSensor const& sensor : parameter) {
            m_rows.push_back(makeRow(sensor, several));
            m_selected.insert({sensor.module, sensor.id});
        }
    }
}

void LiveTable::update(int pid, Values const& values, LiveTime now, unsigned int module)
{
    if (!m_selected.contains({module, pid})) {
        return;
    }
    for (LiveRow& row : m_rows) {
        if (obd::Uid2Pid(row.uid) != pid || row.module != module) {
            continue;
        }
        auto const found =
            std::find_if(values.begin(), values.end(), [&row](auto const& value) { return value->uid == row.uid; });
        if (found != values.end()) {
            take(row, **found, now);
        } else {
            forget(row);
        }
    }
    ++m_readings;
    m_lastReading = now;
    countRound({module, pid}, now);
}

void LiveTable::countRound(Key key, LiveTime now)
{
    if (m_seen.contains(key)) {
        endRound(now);
    }
    if (m_seen.empty() && m_roundStart == LiveTime()) {
        m_roundStart = now;
    }
    m_seen.insert(key);
    if (m_seen.size() == m_selected.size()) {
        endRound(now);
    }
}

void LiveTable::endRound(LiveTime now)
{
    ++m_rounds;
    m_seen.clear();
    m_roundLength = now - m_roundStart;
    m_roundStart = now;
}

void LiveTable::expire(LiveTime now)
{
    // The first round, and one that has become longer, are measured as far as they have come.
    LiveTime::duration const round = std::max(m_roundLength, m_lastReading - m_roundStart);
    for (LiveRow& row : m_rows) {
        if (now - row.updated > patience + patienceRounds * std::max(round, row.period)) {
            forget(row);
        }
    }
}

std::vector<LiveRow const*> LiveTable::rowsOf(int pid, unsigned int module) const
{
    std::vector<LiveRow const*> rows;
    for (LiveRow const& row : m_rows) {
        if (obd::Uid2Pid(row.uid) == pid && row.module == module) {
            rows.push_back(&row);
        }
    }
    return rows;
}

std::string nameWithUnit(LiveRow const& row)
{
    return row.unit.empty() ? row.name : fmt::format("{} ({})", row.name, row.unit);
}

std::string orDash(std::string const& text)
{
    return text.empty() ? "-" : text;
}

} // namespace velmora::cli
