#include "program/live/playtable.h"

#include <obd/parameteridentifier.h>

#include <fmt/format.h>

#include <algorithm>

namespace velmora::cli {

namespace {

SignalRow rowOf(RecordedSensor const& sensor, std::size_t number)
{
    SignalRow row;
    row.module = sensor.about.module;
    row.id = static_cast<int>(number);
    row.sensor = sensor.about.sensor;
    row.request = sensor.about.pid;
    row.name = sensor.about.name;
    row.unit = sensor.about.unit;
    row.numeric = sensor.numeric;
    return row;
}

} // namespace

PlayTable::PlayTable(Recording const& recording) : m_recording(recording)
{
    std::vector<std::size_t> all(recording.sensors.size());
    for (std::size_t i = 0; i < all.size(); ++i) {
        all[i] = i;
    }
    select(all);
}

void PlayTable::select(std::vector<std::size_t> const& sensors)
{
    m_selected = sensors;
    m_statistics.assign(m_recording.sensors.size(), {});
    LiveTable::Parameters parameters;
    for (std::size_t const each : sensors) {
        parameters.emplace_back(rowOf(m_recording.sensors[each], each));
    }
    m_table.select(parameters);
}

LiveRow const* PlayTable::take(std::size_t sensor, RecordedValue const& value)
{
    RecordedSensor const& recorded = m_recording.sensors[sensor];
    int const uid = obd::Pid2Uid(static_cast<int>(sensor));
    LiveTable::Values values;
    if (double const* const number = std::get_if<double>(&value.value)) {
        Statistics& one = m_statistics[sensor];
        one.lowest = one.count == 0 ? *number : std::min(one.lowest, *number);
        one.highest = one.count == 0 ? *number : std::max(one.highest, *number);
        ++one.count;
        one.mean += (*number - one.mean) / static_cast<double>(one.count);
        auto const text = [&recorded](double each) { return fmt::format("{:.{}f}", each, recorded.decimals); };
        values.push_back(std::make_shared<obd::SensorValueDataModel>(uid, text(*number), text(one.lowest),
                                                                     text(one.highest), text(one.mean)));
    } else if (std::string const* const text = std::get_if<std::string>(&value.value)) {
        values.push_back(std::make_shared<obd::SensorValueDataModel>(uid, *text));
    }
    m_table.update(static_cast<int>(sensor), values, timeOf(value.time), recorded.about.module);
    std::vector<LiveRow const*> const rows = m_table.rowsOf(static_cast<int>(sensor), recorded.about.module);
    return rows.empty() ? nullptr : rows.front();
}

void PlayTable::expire(std::int64_t time)
{
    m_table.expire(timeOf(time));
}

} // namespace velmora::cli
