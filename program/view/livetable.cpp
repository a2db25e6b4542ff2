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

LiveRow makeRow(obd::ParameterDescriptor const& parameter, obd::SensorDescriptor const& sensor, bool alone)
{
    LiveRow row{};
    row.uid = sensor.uid();
    row.name = alone ? parameter.description() : parameter.description() + ": " + sensor.description();
    row.unit = unitLabel(sensor.uid(), sensor.unit());
    // What has a unit is a number, though the library gives some, such as distances, as plain digits.
    row.numeric = sensor.isNumeric() || !row.unit.empty();
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

void LiveTable::select(Descriptors const& parameters)
{
    m_rows.clear();
    m_selected.clear();
    m_seen.clear();
    m_roundLength = {};
    for (auto const& parameter : parameters) {
        auto const sensors = parameter->sensors();
        for (auto const& sensor : sensors) {
            m_rows.push_back(makeRow(*parameter, *sensor, sensors.size() == 1));
        }
        m_selected.insert(parameter->pid());
    }
}

void LiveTable::update(int pid, Values const& values, LiveTime now)
{
    if (!m_selected.contains(pid)) {
        return;
    }
    for (LiveRow& row : m_rows) {
        if (obd::Uid2Pid(row.uid) != pid) {
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
    countRound(pid, now);
}

void LiveTable::countRound(int pid, LiveTime now)
{
    if (beginsRound(pid)) {
        endRound(now);
    }
    if (m_seen.empty() && m_roundStart == LiveTime()) {
        m_roundStart = now;
    }
    m_seen.insert(pid);
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
        if (now - row.updated > patience + patienceRounds * round) {
            forget(row);
        }
    }
}

std::vector<LiveRow const*> LiveTable::rowsOf(int pid) const
{
    std::vector<LiveRow const*> rows;
    for (LiveRow const& row : m_rows) {
        if (obd::Uid2Pid(row.uid) == pid) {
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
