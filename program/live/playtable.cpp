#include "program/live/playtable.h"

#include <obd/parameteridentifier.h>

#include <fmt/format.h>

#include <algorithm>

namespace velmora::cli {

namespace {

LiveSensor liveSensor(RecordedSensor const& recorded, std::size_t number)
{
    LiveSensor sensor;
    sensor.module = recorded.about.module;
    sensor.id = static_cast<int>(number);
    sensor.uid = obd::Pid2Uid(sensor.id);
    sensor.isSignal = !recorded.about.sensor.empty();
    sensor.key = recorded.about.sensor;
    sensor.request = recorded.about.pid;
    sensor.name = recorded.about.name;
    sensor.unit = sensor.metricUnit = recorded.about.unit;
    sensor.numeric = recorded.numeric;
    return sensor;
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
        parameters.push_back({liveSensor(m_recording.sensors[each], each)});
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
