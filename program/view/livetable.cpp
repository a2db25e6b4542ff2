#include "program/view/livetable.h"

#include "libvelmora/report/unitlabel.h"

#include <fmt/format.h>

#include <algorithm>
#include <charconv>
#include <cmath>

namespace velmora::cli {

namespace {

constexpr std::chrono::milliseconds trendStep{250};
constexpr std::chrono::seconds patience{2};
constexpr int patienceRounds = 3;

LiveRow makeRow(LiveParameter const& chosen, obd::SensorDescriptor const& sensor, bool alone)
{
    obd::ParameterDescriptor const& parameter = *chosen.descriptor;
    LiveRow row{};
    row.uid = sensor.uid();
    row.module = chosen.module;
    if (chosen.hertz) {
        row.period = std::chrono::duration_cast<LiveTime::duration>(std::chrono::duration<double>(1.0 / *chosen.hertz));
    }
    row.name = alone ? parameter.description() : parameter.description() + ": " + sensor.description();
    row.unit = unitLabel(sensor.uid(), sensor.unit());
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
    row.unit = chosen.signal->unit;
    row.sensor = chosen.signal->sensor;
    row.request = chosen.signal->request;
    row.numeric = chosen.signal->numeric;
    return row;
}

void addTrend(LiveRow& row, LiveTime now)
{
    double number = 0.0;
    std::from_chars(row.value.data(), row.value.data() + row.value.size(), number);
    if (!std::isfinite(number)) {
        return; // such as the fuel consumption of air with a lambda of 0
    }
    if (!row.trend.empty() && now - row.trendTime < trendStep) {
        return;
    }
    row.trend.push_back(number);
    row.trendTime = now;
    if (row.trend.size() > LiveTable::trendLength) {
        row.trend.pop_front();
    }
}

void forget(LiveRow& row)
{
    row.value.clear();
}

void take(LiveRow& row, obd::SensorValueDataModel const& value, LiveTime now)
{
    row.value = value.value;
    row.minimum = value.minimum;
    row.mean = value.mean;
    row.maximum = value.maximum;
    row.updated = now;
    if (row.numeric) {
        addTrend(row, now);
    }
}

} // namespace

void LiveTable::select(Parameters const& parameters)
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
            m_rows.push_back(makeRow(parameter, *sensor, sensors.size() == 1));
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
