#include "program/view/live/livetable.h"

#include "common/text/text.h"

#include <velmora/offers.h>

#include <fmt/format.h>

#include <algorithm>
#include <limits>

namespace velmora::cli {

namespace {

constexpr std::chrono::seconds patience{2};
constexpr int patienceRounds = 3;

LiveRow makeRow(LiveParameter const& chosen, obd::SensorDescriptor const& sensor, bool alone, Units units)
{
    obd::ParameterDescriptor const& parameter = *chosen.descriptor;
    LiveRow row{};
    row.uid = sensor.uid();
    row.module = chosen.module;
    if (chosen.hertz) {
        row.period = std::chrono::duration_cast<LiveTime::duration>(std::chrono::duration<double>(1.0 / *chosen.hertz));
    }
    row.alone = alone;
    row.name = alone ? parameter.description() : parameter.description() + ": " + sensor.description();
    row.unit = sensorUnit(sensor.uid(), sensor.unit(), units);
    auto const metric = chosen.metricUnits.find(row.uid);
    row.metricUnit = metric != chosen.metricUnits.end() ? metric->second : row.unit;
    // What has a unit is a number, though the library gives some, such as distances, as plain digits.
    row.numeric = sensor.isNumeric() || !row.unit.empty();
    return row;
}

LiveRow makeRow(LiveParameter const& chosen)
{
    LiveRow row{};
    row.uid = obd::Pid2Uid(chosen.signal->id);
    row.module = chosen.module;
    if (chosen.hertz) {
        row.period = std::chrono::duration_cast<LiveTime::duration>(std::chrono::duration<double>(1.0 / *chosen.hertz));
    }
    row.name = chosen.signal->name;
    row.unit = row.metricUnit = chosen.signal->unit;
    row.sensor = chosen.signal->sensor;
    row.request = chosen.signal->request;
    row.numeric = chosen.signal->numeric;
    return row;
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

std::string keyOf(LiveRow const& row)
{
    if (!row.sensor.empty()) {
        return row.sensor;
    }
    std::string const key = sensorKey(obd::Uid2Pid(row.uid));
    return row.alone ? key : fmt::format("{}_{}", key, row.uid % 10 + 1);
}

void LiveTable::setLimits(std::function<SensorLimit(LiveRow const& row)> const& limitOf)
{
    for (LiveRow& row : m_rows) {
        row.limit = limitOf(row);
    }
}

void LiveTable::select(Parameters const& parameters, Units units)
{
    m_rows.clear();
    m_selected.clear();
    m_seen.clear();
    m_roundLength = {};
    bool const several = std::any_of(parameters.begin(), parameters.end(), [&](LiveParameter const& each) {
        return each.module != parameters.front().module;
    });
    for (LiveParameter const& parameter : parameters) {
        if (parameter.signal) {
            m_rows.push_back(makeRow(parameter));
            if (several && parameter.module != 0) {
                m_rows.back().name.insert(0, fmt::format("{:X} ", parameter.module));
            }
            m_selected.insert({parameter.module, parameter.signal->id});
            continue;
        }
        auto const sensors = parameter.descriptor->sensors();
        for (auto const& sensor : sensors) {
            m_rows.push_back(makeRow(parameter, *sensor, sensors.size() == 1, units));
            if (several) {
                m_rows.back().name.insert(0, fmt::format("{:X} ", parameter.module));
            }
        }
        m_selected.insert({parameter.module, parameter.descriptor->pid()});
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
